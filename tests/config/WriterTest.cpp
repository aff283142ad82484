#include "CXMLWriter.h"

#include "CXMLReader.h"

#include "Messages.h"

#include "support/Engine.h"
#include "support/Expect.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

#include <fstream>
#include <memory>
#include <type_traits>

using namespace kxtest;

namespace
{

const char* const kNoData = "Data Pointer not set in xml writer";

static_assert(std::is_base_of<IConfigWriter, CXMLWriter>::value, "");
static_assert(!std::is_copy_constructible<CXMLWriter>::value, "");
static_assert(!std::is_copy_assignable<CXMLWriter>::value, "");

const std::string kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";

class WriterTest : public testing::Test
{
protected:
    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "<cfg><name>box</name></cfg>");
    const std::string m_other = m_folder.Write("other.xml", "<cfg><name>lid</name></cfg>");
    const std::string m_missing = m_folder.Path("missing.xml");

    /** A document without an owner yet. */
    static xmlDocPtr Loose() { return ParseText("<cfg><name>loose</name></cfg>"); }
};

/** Keeps the document that a writer holds reachable: adopts it, so that the test owns it again. */
struct FreeDocument
{
    void operator()(xmlDocPtr document) const { xmlFreeDoc(document); }
};
using OwnedDocument = std::unique_ptr<xmlDoc, FreeDocument>;

} // namespace

// --- Construction and destruction

TEST_F(WriterTest, DefaultConstructorLogsItsEntryOnly)
{
    LogRecorder log;
    CXMLWriter writer;
    EXPECT_EQ(Records({Trace("CXMLWriter", "+")}), log.Take());
    EXPECT_EQ(7, writer.SetValue("cfg.name", "x"));
    EXPECT_EQ(-2, writer.SaveData());
}

TEST_F(WriterTest, PathConstructorParsesTheFileAtOnce)
{
    EngineCalls calls;
    LogRecorder log;
    CXMLWriter writer(m_file);
    EXPECT_EQ(Records({Trace("CXMLWriter", "File Path " + m_file)}), log.Take());
    EXPECT_EQ(std::vector<std::string>({m_file}), calls.Parsed());
    EXPECT_EQ(0, writer.SetValue("cfg.name", "x"));
}

TEST_F(WriterTest, PathConstructorCompletesWithoutDocumentWhenTheFileIsMissing)
{
    LogRecorder log;
    CXMLWriter writer(m_missing);
    EXPECT_EQ(
        Records({Trace("CXMLWriter", "File Path " + m_missing), Error("CXMLWriter", kNoDocument)}),
        log.Take());
    EXPECT_EQ(7, writer.SetValue("cfg.name", "x"));
}

TEST_F(WriterTest, PathConstructorNamesThePathToSaveTo)
{
    CXMLWriter writer(m_file);
    EXPECT_EQ(0, writer.SetValue("cfg.name", "saved"));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>saved</name></cfg>\n", ReadFile(m_file));
}

TEST_F(WriterTest, PathOfAFailedConstructionIsKept)
{
    CXMLWriter writer(m_missing);
    writer.SetDataPtr(Loose());
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_TRUE(FileExists(m_missing));
}

TEST_F(WriterTest, DestructorFreesTheDocumentExactlyOnce)
{
    const xmlDocPtr document = Loose();
    auto writer = std::make_unique<CXMLWriter>();
    writer->SetDataPtr(document);
    EngineCalls calls;
    LogRecorder log;
    writer.reset();
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Frees());
    EXPECT_EQ(Records({Trace("~CXMLWriter", "Destructor")}), log.Take());
}

TEST_F(WriterTest, DestructorWithoutDocumentFreesNothing)
{
    auto writer = std::make_unique<CXMLWriter>(m_missing);
    EngineCalls calls;
    LogRecorder log;
    writer.reset();
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(Records({Trace("~CXMLWriter", "Destructor")}), log.Take());
}

TEST_F(WriterTest, IsDestroyedCompletelyThroughItsInterface)
{
    const EngineMemory memory;
    const NewCounter heap;
    {
        const std::unique_ptr<IConfigWriter> writer(GetCXMLWriterObject(m_file.c_str()));
        ASSERT_NE(nullptr, writer);
        writer->SetValue("cfg.name", std::string(100, 'x'));
    }
    EXPECT_EQ(0, heap.Live());
    EXPECT_EQ(0, memory.Live());
}

// --- ParseFile

TEST_F(WriterTest, ParseFileHoldsTheDocumentAndThePath)
{
    CXMLWriter writer;
    LogRecorder log;
    EXPECT_EQ(0, writer.ParseFile(m_file));
    EXPECT_EQ(Records({Trace("ParseFile", "+"), Trace("ParseFile", "-")}), log.Take());
    EXPECT_EQ(0, writer.SetValue("cfg.name", "new"));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>new</name></cfg>\n", ReadFile(m_file));
}

TEST_F(WriterTest, ParseFileFreesTheEarlierDocument)
{
    const xmlDocPtr document = Loose();
    CXMLWriter writer;
    writer.SetDataPtr(document);
    EngineCalls calls;
    EXPECT_EQ(0, writer.ParseFile(m_file));
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Frees());
}

TEST_F(WriterTest, ParseFileThatFailsFreesTheEarlierDocumentToo)
{
    const std::string bad = m_folder.Write("bad.xml", "<cfg><name>");
    for (const std::string& path : {m_missing, bad, m_folder.Path("")})
    {
        const xmlDocPtr document = Loose();
        CXMLWriter writer;
        writer.SetDataPtr(document);
        EngineCalls calls;
        LogRecorder log;
        EXPECT_EQ(22, writer.ParseFile(path));
        EXPECT_EQ(Records({Trace("ParseFile", "+"), Error("ParseFile", kNoDocument),
                           Trace("ParseFile", "-")}),
                  log.Take());
        // Engines free what they made of a malformed file, and may have made it at the same
        // address.
        EXPECT_GE(calls.Freed(document), 1u);
        EXPECT_EQ(-2, writer.SaveData());
        EXPECT_EQ(7, writer.SetValue("cfg.name", "x"));
    }
    EXPECT_EQ("<cfg><name>", ReadFile(bad));
}

TEST_F(WriterTest, ParseFileOfAnEmptyPathFailsAndKeepsThePathToSaveTo)
{
    CXMLWriter writer(m_file);
    EngineCalls calls;
    LogRecorder log;
    EXPECT_EQ(22, writer.ParseFile(""));
    EXPECT_EQ(Records({Trace("ParseFile", "+"), Error("ParseFile", kNoDocument),
                       Trace("ParseFile", "-")}),
              log.Take());
    EXPECT_EQ(std::vector<std::string>({""}), calls.Parsed());
    EXPECT_EQ(1u, calls.Frees());

    writer.SetDataPtr(Loose());
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>loose</name></cfg>\n", ReadFile(m_file));
}

TEST_F(WriterTest, FailedParseNamesThePathToSaveToAllTheSame)
{
    CXMLWriter writer(m_file);
    EXPECT_EQ(22, writer.ParseFile(m_missing));
    writer.SetDataPtr(Loose());
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_TRUE(FileExists(m_missing));
    EXPECT_EQ("<cfg><name>box</name></cfg>", ReadFile(m_file));
}

namespace
{

/** Notes the path that it is given and refuses to save to any but its own. */
class OwnPathWriter : public CXMLWriter
{
public:
    explicit OwnPathWriter(const std::string& own) : m_own(own) {}

    int SetPath(const std::string& path) override
    {
        m_asked += "[" + path + "]";
        return CXMLWriter::SetPath(m_own);
    }

    std::string m_asked;

private:
    const std::string m_own;
};

} // namespace

TEST_F(WriterTest, ParseFileHonoursADerivedClasssSetPath)
{
    OwnPathWriter writer(m_other);
    EXPECT_EQ(0, writer.ParseFile(m_file));
    EXPECT_EQ("[" + m_file + "]", writer.m_asked);
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>box</name></cfg>\n", ReadFile(m_other));
    EXPECT_EQ("<cfg><name>box</name></cfg>", ReadFile(m_file));
}

TEST_F(WriterTest, ParseFileReturnsTheResultOfSetPathWhenTheParseSucceeds)
{
    OwnPathWriter writer(""); // its SetPath refuses with 7
    EXPECT_EQ(7, writer.ParseFile(m_file));
    EXPECT_EQ(0, writer.SetValue("cfg.name", "x")); // the document is held
    EXPECT_EQ(22, writer.ParseFile(m_missing));
}

namespace
{

/** Saves what it holds before it takes a new path. */
class SavingWriter : public CXMLWriter
{
public:
    using CXMLWriter::CXMLWriter;

    int SetPath(const std::string& path) override
    {
        LogRecorder::Note(Engine("SetPath"));
        SaveData();
        return CXMLWriter::SetPath(path);
    }
};

} // namespace

TEST_F(WriterTest, ParseFileSetsThePathAfterItsEntryAndBeforeItFreesTheEarlierDocument)
{
    SavingWriter writer(m_file);
    EXPECT_EQ(0, writer.SetValue("cfg.name", "kept"));
    EngineCalls calls;
    calls.ShowAmongRecords();
    LogRecorder log;
    EXPECT_EQ(0, writer.ParseFile(m_other));
    EXPECT_EQ(Records({Trace("ParseFile", "+"), Engine("SetPath"), Trace("SaveData", "+"),
                       Engine("xmlSaveFileEnc"), Engine("xmlFreeDoc"), Engine("xmlParseFile"),
                       Trace("ParseFile", "-")}),
              log.Take());
    EXPECT_EQ(kDeclaration + "<cfg><name>kept</name></cfg>\n", ReadFile(m_file));
}

// --- SetPath

TEST_F(WriterTest, SetPathNamesThePathWithoutParsingOrLogging)
{
    CXMLWriter writer(m_file);
    EngineCalls calls;
    LogRecorder log;
    EXPECT_EQ(0, writer.SetPath(m_missing));
    EXPECT_EQ(Records(), log.Take());
    EXPECT_EQ(0u, calls.Parsed().size());
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>box</name></cfg>\n", ReadFile(m_missing));
}

TEST_F(WriterTest, SetPathRefusesAnEmptyPathAndKeepsTheEarlier)
{
    CXMLWriter writer(m_file);
    LogRecorder log;
    EXPECT_EQ(7, writer.SetPath(""));
    EXPECT_EQ(Records(), log.Take());
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(kDeclaration + "<cfg><name>box</name></cfg>\n", ReadFile(m_file));
}

// --- SetDataPtr

TEST_F(WriterTest, SetDataPtrDropsTheDocumentHeldWithoutFreeingIt)
{
    const OwnedDocument first(Loose());
    const xmlDocPtr second = Loose();
    EngineCalls calls;
    {
        CXMLWriter writer;
        LogRecorder log;
        writer.SetDataPtr(first.get());
        writer.SetDataPtr(second);
        EXPECT_EQ(Records(), log.Take());
        EXPECT_EQ(0u, calls.Frees());
    }
    EXPECT_EQ(0u, calls.Freed(first.get()));
    EXPECT_EQ(1u, calls.Freed(second));
}

TEST_F(WriterTest, SetDataPtrOfTheDocumentHeldKeepsIt)
{
    const xmlDocPtr document = Loose();
    EngineCalls calls;
    {
        CXMLWriter writer;
        writer.SetDataPtr(document);
        writer.SetDataPtr(document);
        EXPECT_EQ(0, writer.SetValue("cfg.name", "x"));
    }
    EXPECT_EQ(1u, calls.Freed(document));
}

TEST_F(WriterTest, SetDataPtrOfNullLeavesTheWriterWithoutDocument)
{
    const OwnedDocument document(Loose());
    CXMLWriter writer(m_missing);
    writer.SetDataPtr(document.get());
    EngineCalls calls;
    LogRecorder log;
    writer.SetDataPtr(nullptr);
    EXPECT_EQ(Records({Error("SetDataPtr", kNoData)}), log.Take());
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(7, writer.SetValue("cfg.name", "x"));
    EXPECT_EQ(-2, writer.SaveData());
    writer.SetDataPtr(nullptr);
}

TEST_F(WriterTest, DocumentWithoutAPathCanBeChangedAndNotSaved)
{
    CXMLWriter writer;
    writer.SetDataPtr(Loose());
    EXPECT_EQ(0, writer.SetValue("cfg.name", "x"));
    EXPECT_EQ(-2, writer.SaveData());
}

TEST_F(WriterTest, AReadersDocumentIsChangedInPlaceAndFreedOnceByTheReader)
{
    auto reader = std::make_unique<CXMLReader>(m_file);
    const void* const document = reader->GetDataPtr();
    auto writer = std::make_unique<CXMLWriter>();
    EngineCalls calls;
    writer->SetDataPtr(reader->GetDataPtr());
    EXPECT_EQ(0, writer->SetPath(m_other));
    EXPECT_EQ(0, writer->SetValue("cfg.name", "shared"));
    EXPECT_EQ("shared", reader->GetValue("cfg.name"));
    EXPECT_EQ(0, writer->SaveData());
    writer->SetDataPtr(nullptr);
    writer.reset();
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ("shared", reader->GetValue("cfg.name"));
    reader.reset();
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Frees());
    EXPECT_EQ(kDeclaration + "<cfg><name>shared</name></cfg>\n", ReadFile(m_other));
}

TEST_F(WriterTest, AnAdoptedDocumentThatIsNotDetachedIsFreedByTheWriter)
{
    const xmlDocPtr document = Loose();
    EngineCalls calls;
    {
        CXMLWriter writer;
        writer.SetDataPtr(document);
    }
    EXPECT_EQ(1u, calls.Freed(document));
}

// --- SaveData

TEST_F(WriterTest, SaveDataLogsItsEntryOnly)
{
    CXMLWriter writer(m_file);
    LogRecorder log;
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(Records({Trace("SaveData", "+")}), log.Take());
    writer.SetPath(m_folder.Path("nowhere/cfg.xml"));
    EXPECT_EQ(-2, writer.SaveData());
    EXPECT_EQ(Records({Trace("SaveData", "+")}), log.Take());
}

TEST_F(WriterTest, SaveDataKeepsTheDocument)
{
    CXMLWriter writer(m_file);
    EngineCalls calls;
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(0, writer.SetValue("cfg.name", "again"));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(kDeclaration + "<cfg><name>again</name></cfg>\n", ReadFile(m_file));
}

TEST_F(WriterTest, SaveDataLeavesTheDocumentUnchanged)
{
    for (const char* const head : {"", "<?xml version='1.0' encoding='ISO-8859-1'?>"})
    {
        const OwnedDocument document(ParseText(
            std::string(head) + "<!DOCTYPE cfg [<!ENTITY e 'x'>]>\n<cfg> <a>&e;</a></cfg>"));
        const auto whole = [&document]
        {
            xmlChar* text = nullptr;
            int size = 0;
            xmlDocDumpMemory(document.get(), &text, &size); // in the document's own encoding
            const std::string copy(reinterpret_cast<char*>(text), static_cast<std::size_t>(size));
            xmlFree(text);
            return copy;
        };
        const std::string before = whole();
        CXMLWriter writer;
        writer.SetDataPtr(document.get());
        writer.SetPath(m_other);
        EXPECT_EQ(0, writer.SaveData());
        EXPECT_EQ(before, whole());
        writer.SetDataPtr(nullptr);
    }
}

TEST_F(WriterTest, AnyNegativeAnswerOfTheEngineIsAFailure)
{
    CXMLWriter writer(m_file);
    EngineCalls calls;
    calls.AnswerSavesWith(-1);
    EXPECT_EQ(-2, writer.SaveData());
    calls.AnswerSavesWith(-1549); // as newer engines answer
    EXPECT_EQ(-2, writer.SaveData());
    calls.AnswerSavesWith(0);
    EXPECT_EQ(0, writer.SaveData());
    calls.AnswerSavesWith(1234); // bytes written
    EXPECT_EQ(0, writer.SaveData());
}

TEST_F(WriterTest, SaveDataFailsOnPathsThatCannotBeWritten)
{
    CXMLWriter writer(m_file);
    for (const std::string& path :
         {m_folder.Path(""), m_folder.Path("nowhere/cfg.xml"), std::string("/dev/full")})
    {
        writer.SetPath(path);
        EXPECT_EQ(-2, writer.SaveData()) << path;
    }
}

TEST_F(WriterTest, SaveDataFailsOnAFullDeviceHoweverLongTheDocument)
{
    CXMLWriter writer(m_file);
    writer.SetValue("cfg.name", std::string(1 << 20, 'x'));
    writer.SetPath("/dev/full");
    EXPECT_EQ(-2, writer.SaveData());
}

TEST_F(WriterTest, SaveDataDeclaresUtf8WhateverTheSourcesEncoding)
{
    const std::string saved = kDeclaration + "<cfg><a>\xC3\xBC</a></cfg>\n";
    const std::string latin =
        m_folder.Write("latin.xml", "<?xml version='1.0' encoding='ISO-8859-1'?>"
                                    "<cfg><a>\xFC</a></cfg>");
    CXMLWriter writer(latin);
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(saved, ReadFile(latin));

    std::string utf16 = "\xFF\xFE";
    for (const char c :
         std::string("<?xml version='1.0' encoding='UTF-16'?><cfg><a>\xFC</a></cfg>"))
    {
        utf16 += c;
        utf16 += '\0';
    }
    const std::string wide = m_folder.Write("wide.xml", utf16);
    EXPECT_EQ(0, writer.ParseFile(wide));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(saved, ReadFile(wide));

    const std::string plain = m_folder.Write("plain.xml", "<cfg><a>\xC3\xBC</a></cfg>");
    EXPECT_EQ(0, writer.ParseFile(plain));
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_EQ(saved, ReadFile(plain));
}

TEST_F(WriterTest, SaveDataKeepsEverythingButTheChangedTextAsItWas)
{
    const std::string head = "<!-- head -->\n"
                             "<!DOCTYPE cfg [\n"
                             "<!ENTITY e \"x\">\n"
                             "<!ATTLIST a b CDATA \"d\">\n"
                             "]>\n"
                             "<?style sheet?>\n";
    const std::string tail = "  <!-- c -->\n"
                             "\t<?pi data?>\n"
                             "  <a b=\"1\"\n     c=\"2\"/>\n"; // the engine joins these lines
    const std::string rest = "  <d><![CDATA[<&>]]></d><e>&e;</e><f/>\n"
                             "<g> x </g>\n"
                             "</cfg>\n<!-- tail -->\n";
    const std::string file =
        m_folder.Write("all.xml", "<?xml version=\"1.0\"?>\n" + head + "<cfg>\n" + tail +
                                      "<name>box</name>" + rest);
    CXMLWriter writer(file);
    EXPECT_EQ(0, writer.SetValue("cfg.name", "new"));
    EXPECT_EQ(0, writer.SaveData());
    const std::string joined = "  <!-- c -->\n"
                               "\t<?pi data?>\n"
                               "  <a b=\"1\" c=\"2\"/>\n";
    EXPECT_EQ(kDeclaration + head + "<cfg>\n" + joined + "<name>new</name>" + rest, ReadFile(file));
}

TEST_F(WriterTest, SaveDataCreatesTheFile)
{
    CXMLWriter writer(m_file);
    writer.SetPath(m_missing);
    EXPECT_EQ(0, writer.SaveData());
    EXPECT_TRUE(FileExists(m_missing));
}

// --- Records

TEST_F(WriterTest, RecordsFollowTheMask)
{
    const Records all = {Trace("CXMLWriter", "+"),
                         Trace("ParseFile", "+"),
                         Error("ParseFile", kNoDocument),
                         Trace("ParseFile", "-"),
                         Error("SetDataPtr", kNoData),
                         Trace("SetValue", "Key cfg.name"),
                         Error("SetValue", "Document structure pointer m_pXmlDoc is NULL"),
                         Trace("ParseFile", "+"),
                         Trace("ParseFile", "-"),
                         Trace("SetValue", "Key cfg.name"),
                         Value("XMLSetValue", "Key :: name"),
                         Value("XMLSetValue", "Key :: name"),
                         Trace("SaveData", "+"),
                         Trace("~CXMLWriter", "Destructor")};
    ExpectRecords(all,
                  [&]
                  {
                      CXMLWriter writer;
                      writer.ParseFile(m_missing);
                      writer.SetDataPtr(nullptr);
                      writer.SetValue("cfg.name", "x");
                      writer.ParseFile(m_file);
                      writer.SetValue("cfg.name", "x");
                      writer.SaveData();
                  });
}

TEST_F(WriterTest, RecordsSurroundTheEnginesWork)
{
    EngineCalls calls;
    calls.ShowAmongRecords();
    LogRecorder log;
    {
        CXMLWriter writer(m_file);
        writer.ParseFile(m_missing);
        writer.ParseFile(m_file);
        writer.SaveData();
    }
    EXPECT_EQ(Records({Trace("CXMLWriter", "File Path " + m_file), Engine("xmlParseFile"),
                       Trace("ParseFile", "+"), Engine("xmlFreeDoc"), Engine("xmlParseFile"),
                       Error("ParseFile", kNoDocument), Trace("ParseFile", "-"),
                       Trace("ParseFile", "+"), Engine("xmlParseFile"), Trace("ParseFile", "-"),
                       Trace("SaveData", "+"), Engine("xmlSaveFileEnc"),
                       Trace("~CXMLWriter", "Destructor"), Engine("xmlFreeDoc")}),
              log.Take());
}

// --- The factories

TEST_F(WriterTest, FactoryMakesAWriterOfTheFile)
{
    LogRecorder log;
    const std::unique_ptr<CXMLWriter> writer(GetCXMLWriterObject(m_file.c_str()));
    ASSERT_NE(nullptr, writer);
    EXPECT_EQ(Records({Trace("CXMLWriter", "File Path " + m_file)}), log.Take());
    EXPECT_EQ(0, writer->SetValue("cfg.name", "x"));
}

TEST_F(WriterTest, FactoryOnAMissingFileYieldsAWriterWithoutDocument)
{
    const std::unique_ptr<CXMLWriter> writer(GetCXMLWriterObject(m_missing.c_str()));
    ASSERT_NE(nullptr, writer);
    EXPECT_EQ(7, writer->SetValue("cfg.name", "x"));
    EXPECT_EQ(-2, writer->SaveData());
}

TEST_F(WriterTest, FactoryGivenANullPathYieldsNullWithoutLoggingOrAllocating)
{
    LogRecorder log;
    const NewCounter heap;
    EXPECT_EQ(nullptr, GetCXMLWriterObject(nullptr));
    EXPECT_EQ(0u, heap.Requests());
    EXPECT_EQ(Records(), log.Take());
}

TEST_F(WriterTest, FactoriesYieldNullWhenTheObjectCannotBeAllocated)
{
    LogRecorder log;
    NewCounter heap;
    heap.FailAt(1); // an empty path needs no memory of its own
    EXPECT_EQ(nullptr, GetCXMLWriterObject(""));
    EXPECT_TRUE(heap.Failed());
    heap.FailAt(1);
    EXPECT_EQ(nullptr, GetCXMLWriterObjectNoParam());
    EXPECT_TRUE(heap.Failed());
    EXPECT_EQ(2u, heap.Requests());
    EXPECT_EQ(Records(), log.Take());
}

TEST_F(WriterTest, FactoryWithoutPathMakesAnEmptyWriter)
{
    LogRecorder log;
    const std::unique_ptr<CXMLWriter> writer(GetCXMLWriterObjectNoParam());
    ASSERT_NE(nullptr, writer);
    EXPECT_EQ(Records({Trace("CXMLWriter", "+")}), log.Take());
    EXPECT_EQ(0, writer->ParseFile(m_file));
    EXPECT_EQ(0, writer->SetValue("cfg.name", "x"));
    EXPECT_EQ(0, writer->SaveData());
}

TEST_F(WriterTest, FactoriesReleaseTheStorageWhenTheConstructorThrows)
{
    LogRecorder log(kMaskAll);
    NewCounter heap;
    LogRecorder::ThrowAt(1);
    EXPECT_THROW(GetCXMLWriterObject("/x"), LogFailure);
    EXPECT_EQ(0, heap.Live());
    LogRecorder::ThrowAt(1);
    EXPECT_THROW(GetCXMLWriterObjectNoParam(), LogFailure);
    EXPECT_EQ(0, heap.Live());
}

TEST_F(WriterTest, FactoryPassesOnTheExceptionOfAPathsCopyWithNothingLost)
{
    const std::string path(100, 'x');
    LogRecorder log(kMaskNone);
    NewCounter heap;
    heap.FailAt(1);
    EXPECT_THROW(GetCXMLWriterObject(path.c_str()), std::bad_alloc);
    EXPECT_EQ(0, heap.Live());
}

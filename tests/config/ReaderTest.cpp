#include "CXMLReader.h"

#include "Messages.h"

#include "support/Engine.h"
#include "support/Expect.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <libxml/parser.h>

#include <memory>
#include <type_traits>

using namespace kxtest;

namespace
{

static_assert(std::is_base_of<IConfigReader, CXMLReader>::value, "");
static_assert(!std::is_copy_constructible<CXMLReader>::value, "");
static_assert(!std::is_copy_assignable<CXMLReader>::value, "");

class ReaderTest : public testing::Test
{
protected:
    TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", "<cfg><name>box</name></cfg>");
    const std::string m_other = m_folder.Write("other.xml", "<cfg><name>lid</name></cfg>");
    const std::string m_missing = m_folder.Path("missing.xml");
};

} // namespace

// --- Construction and destruction

TEST_F(ReaderTest, DefaultConstructorHoldsNoDocumentAndLogsNothing)
{
    LogRecorder log;
    {
        CXMLReader reader;
        EXPECT_EQ(nullptr, reader.GetDataPtr());
        EXPECT_EQ(Records(), log.Take());
    }
    EXPECT_EQ(Records({Trace("~CXMLReader", "Destructor")}), log.Take());
}

TEST_F(ReaderTest, PathConstructorLogsThePathInPlaceOfTheTrace)
{
    LogRecorder log;
    CXMLReader reader(m_file);
    EXPECT_NE(nullptr, reader.GetDataPtr());
    EXPECT_EQ(Records({Trace("CXMLReader", "File Path " + m_file)}), log.Take());
}

TEST_F(ReaderTest, PathConstructorHandsThePathToTheEngineAsItIs)
{
    EngineCalls calls;
    CXMLReader reader(m_file);
    EXPECT_EQ(std::vector<std::string>({m_file}), calls.Parsed());
}

TEST_F(ReaderTest, PathConstructorCompletesWithoutDocumentWhenTheFileIsMissing)
{
    LogRecorder log;
    CXMLReader reader(m_missing);
    EXPECT_EQ(nullptr, reader.GetDataPtr());
    EXPECT_EQ(
        Records({Trace("CXMLReader", "File Path " + m_missing), Error("CXMLReader", kNoDocument)}),
        log.Take());
}

TEST_F(ReaderTest, DestructorFreesTheDocumentExactlyOnce)
{
    auto reader = std::make_unique<CXMLReader>(m_file);
    const void* const document = reader->GetDataPtr();
    EngineCalls calls;
    LogRecorder log;
    reader.reset();
    EXPECT_EQ(1u, calls.Freed(document));
    EXPECT_EQ(1u, calls.Frees());
    EXPECT_EQ(Records({Trace("~CXMLReader", "Destructor")}), log.Take());
}

TEST_F(ReaderTest, DestructorWithoutDocumentFreesNothing)
{
    auto reader = std::make_unique<CXMLReader>(m_missing);
    EngineCalls calls;
    LogRecorder log;
    reader.reset();
    EXPECT_EQ(0u, calls.Frees());
    EXPECT_EQ(Records({Trace("~CXMLReader", "Destructor")}), log.Take());
}

TEST_F(ReaderTest, IsDestroyedCompletelyThroughItsInterface)
{
    const EngineMemory memory;
    const NewCounter heap;
    {
        IConfigReader* const reader = GetCXMLReaderObject(m_file.c_str());
        ASSERT_NE(nullptr, reader);
        delete reader;
    }
    EXPECT_EQ(0, heap.Live());
    EXPECT_EQ(0, memory.Live());
}

TEST_F(ReaderTest, RecordsFollowTheMask)
{
    const Records all = {Trace("CXMLReader", "File Path " + m_missing),
                         Error("CXMLReader", kNoDocument),
                         Trace("ParseFile", "+"),
                         Error("ParseFile", kNoDocument),
                         Trace("ParseFile", "-"),
                         Trace("~CXMLReader", "Destructor")};
    ExpectRecords(all,
                  [&]
                  {
                      CXMLReader reader(m_missing);
                      reader.ParseFile(m_missing);
                  });
}

// --- ParseFile

TEST_F(ReaderTest, ParseFileHoldsTheDocument)
{
    CXMLReader reader;
    LogRecorder log;
    EXPECT_EQ(0, reader.ParseFile(m_file));
    EXPECT_EQ(Records({Trace("ParseFile", "+"), Trace("ParseFile", "-")}), log.Take());
    ASSERT_NE(nullptr, reader.GetDataPtr());
    EXPECT_EQ("box", reader.GetValue("cfg.name"));
}

TEST_F(ReaderTest, ParseFileThatFailsLeavesNoDocument)
{
    CXMLReader reader(m_file);
    void* const document = reader.GetDataPtr();
    EngineCalls calls;
    LogRecorder log;
    EXPECT_EQ(22, reader.ParseFile(m_missing));
    EXPECT_EQ(Records({Trace("ParseFile", "+"), Error("ParseFile", kNoDocument),
                       Trace("ParseFile", "-")}),
              log.Take());
    EXPECT_EQ(nullptr, reader.GetDataPtr());
    EXPECT_EQ(0u, calls.Frees());
    xmlFreeDoc(static_cast<xmlDocPtr>(document));
}

TEST_F(ReaderTest, FailedParseUnderTheErrorBitAloneIsOneRecord)
{
    CXMLReader reader;
    LogRecorder log(kMaskError);
    reader.ParseFile(m_missing);
    EXPECT_EQ(Records({Error("ParseFile", kNoDocument)}), log.Take());
}

TEST_F(ReaderTest, SecondParseKeepsTheFirstDocumentAllocated)
{
    CXMLReader reader;
    EXPECT_EQ(0, reader.ParseFile(m_file));
    const auto first = static_cast<xmlDocPtr>(reader.GetDataPtr());
    EngineCalls calls;
    EXPECT_EQ(0, reader.ParseFile(m_other));
    EXPECT_NE(first, reader.GetDataPtr());
    EXPECT_EQ("lid", reader.GetValue("cfg.name"));
    EXPECT_EQ(0u, calls.Frees());

    const std::string text = Serialized(first); // still usable
    EXPECT_NE(std::string::npos, text.find("<name>box</name>"));
    xmlFreeDoc(first);
}

TEST_F(ReaderTest, DestructorAfterASecondParseFreesTheSecondDocumentOnly)
{
    auto reader = std::make_unique<CXMLReader>(m_file);
    const auto first = static_cast<xmlDocPtr>(reader->GetDataPtr());
    reader->ParseFile(m_other);
    const void* const second = reader->GetDataPtr();
    {
        EngineCalls calls;
        reader.reset();
        EXPECT_EQ(1u, calls.Freed(second));
        EXPECT_EQ(1u, calls.Frees());
    }
    xmlFreeDoc(first);
}

TEST_F(ReaderTest, ParseSucceedsAgainAfterAFailure)
{
    CXMLReader reader(m_missing);
    EXPECT_EQ(0, reader.ParseFile(m_file));
    EXPECT_EQ("box", reader.GetValue("cfg.name"));
}

// --- Files that give no document

namespace
{

struct BadFile
{
    const char* name;
    const char* content; // null: not a file
};

void PrintTo(const BadFile& file, std::ostream* out)
{
    *out << file.name;
}

class BadFileTest : public ReaderTest, public testing::WithParamInterface<BadFile>
{
protected:
    std::string Make() const
    {
        const BadFile& file = GetParam();
        if (file.content != nullptr)
        {
            return m_folder.Write("bad.xml", file.content);
        }
        return std::string(file.name) == "Directory" ? m_folder.Path("") : m_missing;
    }
};

} // namespace

TEST_P(BadFileTest, GivesAReaderWithoutDocumentAndTheMessage)
{
    const std::string path = Make();
    CXMLReader().ParseFile(path); // the engine sets itself up lazily
    const EngineMemory memory;
    {
        LogRecorder log;
        CXMLReader reader(path);
        EXPECT_EQ(nullptr, reader.GetDataPtr());
        EXPECT_EQ(
            Records({Trace("CXMLReader", "File Path " + path), Error("CXMLReader", kNoDocument)}),
            log.Take());
        EXPECT_EQ(22, reader.ParseFile(path));
        std::string value = "old";
        EXPECT_EQ(22, reader.GetValue("cfg.name", value));
        EXPECT_EQ("old", value);
    }
    EXPECT_EQ(0, memory.Live());
}

INSTANTIATE_TEST_SUITE_P(
    Files, BadFileTest,
    testing::Values(BadFile{"Missing", nullptr}, BadFile{"Directory", nullptr},
                    BadFile{"Empty", ""}, BadFile{"Blank", " \n"}, BadFile{"Unclosed", "<cfg><a>"},
                    BadFile{"TwoRoots", "<cfg/><cfg/>"}, BadFile{"NotXml", "name=box\n"},
                    BadFile{"BadByte", "<cfg>\xFF\xFE</cfg>"},
                    BadFile{"UndefinedEntity", "<cfg>&nowhere;</cfg>"}),
    [](const testing::TestParamInfo<BadFile>& file) { return std::string(file.param.name); });

TEST_F(ReaderTest, UnreadableFileGivesAReaderWithoutDocument)
{
    if (geteuid() == 0)
    {
        // Permissions do not bind the superuser: drop to another user for the time being.
        ASSERT_EQ(0, chmod(m_folder.Path("").c_str(), 0755));
        ASSERT_EQ(0, chmod(m_file.c_str(), 0600));
        ASSERT_EQ(0, seteuid(65534));
    }
    else
    {
        ASSERT_EQ(0, chmod(m_file.c_str(), 0));
    }
    {
        LogRecorder log(kMaskError);
        CXMLReader reader(m_file);
        EXPECT_EQ(nullptr, reader.GetDataPtr());
        EXPECT_EQ(Records({Error("CXMLReader", kNoDocument)}), log.Take());
    }
    if (getuid() == 0)
    {
        ASSERT_EQ(0, seteuid(0));
    }
}

TEST_F(ReaderTest, EmptyPathGivesNoDocument)
{
    LogRecorder log;
    CXMLReader reader("");
    EXPECT_EQ(nullptr, reader.GetDataPtr());
    EXPECT_EQ(Records({Trace("CXMLReader", "File Path "), Error("CXMLReader", kNoDocument)}),
              log.Take());
}

TEST_F(ReaderTest, TheEnginesOwnDiagnosisIsLeftAsItIs)
{
    TakeEngineErrors();
    const std::string bad = m_folder.Write("bad.xml", "<cfg><a></cfg>");
    CXMLReader reader(bad);
    EXPECT_NE(std::string::npos, TakeEngineErrors().find("bad.xml"));
    reader.ParseFile(bad);
    EXPECT_NE(std::string::npos, TakeEngineErrors().find("bad.xml"));
}

TEST_F(ReaderTest, TheEnginesDefaultsAreLeftAsTheyAre)
{
    // Each asks for the present value by setting another, and puts it back.
    const auto defaults = []
    {
        const int blanks = xmlKeepBlanksDefault(1);
        xmlKeepBlanksDefault(blanks);
        const int entities = xmlSubstituteEntitiesDefault(0);
        xmlSubstituteEntitiesDefault(entities);
        const int lines = xmlLineNumbersDefault(0);
        xmlLineNumbersDefault(lines);
        return std::vector<int>({blanks, entities, lines});
    };
    const xmlGenericErrorFunc errors = xmlGenericError;
    const std::vector<int> before = defaults();
    CXMLReader reader(m_missing);
    reader.ParseFile(m_file);
    reader.GetValue("cfg.name");
    xmlFreeDoc(static_cast<xmlDocPtr>(reader.GetDataPtr()));
    reader.ParseFile(m_missing);
    EXPECT_EQ(before, defaults());
    EXPECT_EQ(errors, xmlGenericError);
}

TEST_F(ReaderTest, FailedParseLeavesOtherReadersAlone)
{
    CXMLReader untouched(m_file);
    CXMLReader reader(m_missing);
    CXMLReader after(m_other);
    EXPECT_EQ("lid", after.GetValue("cfg.name"));
    EXPECT_EQ("box", untouched.GetValue("cfg.name"));
}

TEST_F(ReaderTest, RecordsSurroundTheEnginesWork)
{
    EngineCalls calls;
    calls.ShowAmongRecords();
    LogRecorder log;
    void* first = nullptr;
    {
        CXMLReader reader(m_file);
        first = reader.GetDataPtr();
        reader.ParseFile(m_missing);
        reader.ParseFile(m_file);
    }
    EXPECT_EQ(Records({Trace("CXMLReader", "File Path " + m_file), Engine("xmlParseFile"),
                       Trace("ParseFile", "+"), Engine("xmlParseFile"),
                       Error("ParseFile", kNoDocument), Trace("ParseFile", "-"),
                       Trace("ParseFile", "+"), Engine("xmlParseFile"), Trace("ParseFile", "-"),
                       Trace("~CXMLReader", "Destructor"), Engine("xmlFreeDoc")}),
              log.Take());
    xmlFreeDoc(static_cast<xmlDocPtr>(first));
}

// --- GetDataPtr

TEST_F(ReaderTest, GetDataPtrHandsOutTheDocumentWithoutALogRecord)
{
    CXMLReader reader(m_file);
    LogRecorder log;
    const auto document = static_cast<xmlDocPtr>(reader.GetDataPtr());
    EXPECT_EQ(Records(), log.Take());
    ASSERT_NE(nullptr, document);
    EXPECT_STREQ("cfg", reinterpret_cast<const char*>(xmlDocGetRootElement(document)->name));
    EXPECT_EQ(document, reader.GetDataPtr());
}

// --- The factory

TEST_F(ReaderTest, FactoryMakesAReaderOfTheFile)
{
    LogRecorder log;
    const std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(m_file.c_str()));
    ASSERT_NE(nullptr, reader);
    EXPECT_NE(nullptr, reader->GetDataPtr());
    EXPECT_EQ(Records({Trace("CXMLReader", "File Path " + m_file)}), log.Take());
}

TEST_F(ReaderTest, FactoryGivenANullPathYieldsNullWithoutLoggingOrAllocating)
{
    LogRecorder log;
    const NewCounter heap;
    EXPECT_EQ(nullptr, GetCXMLReaderObject(nullptr));
    EXPECT_EQ(0u, heap.Requests());
    EXPECT_EQ(Records(), log.Take());
}

TEST_F(ReaderTest, FactoryOnAMissingFileYieldsAReaderWithoutDocument)
{
    const std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(m_missing.c_str()));
    ASSERT_NE(nullptr, reader);
    EXPECT_EQ(nullptr, reader->GetDataPtr());
    std::string value;
    EXPECT_EQ(22, reader->GetValue("cfg.name", value));
}

TEST_F(ReaderTest, FactoryGivenAnEmptyPathYieldsAReaderWithoutDocument)
{
    const std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(""));
    ASSERT_NE(nullptr, reader);
    EXPECT_EQ(nullptr, reader->GetDataPtr());
}

TEST_F(ReaderTest, FactoryYieldsNullWhenTheObjectCannotBeAllocated)
{
    LogRecorder log;
    EngineCalls calls;
    NewCounter heap;
    heap.FailAt(1); // an empty path is the only one that no kind of string allocates for
    CXMLReader* const reader = GetCXMLReaderObject("");
    EXPECT_TRUE(heap.Failed());
    EXPECT_EQ(nullptr, reader);
    EXPECT_EQ(1u, heap.Requests());
    EXPECT_EQ(0u, calls.Parsed().size());
    EXPECT_EQ(Records(), log.Take());
}

TEST_F(ReaderTest, FactoryPassesOnTheExceptionOfThePathsCopy)
{
    const std::string path(100, 'x');
    NewCounter heap;
    heap.FailAt(1);
    EXPECT_THROW(GetCXMLReaderObject(path.c_str()), std::bad_alloc);
    EXPECT_EQ(0, heap.Live());
}

TEST_F(ReaderTest, FactoryReleasesTheStorageWhenTheConstructorThrows)
{
    LogRecorder log;
    LogRecorder::ThrowAt(1);
    NewCounter heap;
    bool thrown = false;
    try
    {
        GetCXMLReaderObject("");
    }
    catch (const LogFailure&)
    {
        thrown = true;
    }
    EXPECT_TRUE(thrown);
    EXPECT_EQ(1u, heap.Requests());
    EXPECT_EQ(0, heap.Live());
    EXPECT_EQ(Records(), log.Take());
}

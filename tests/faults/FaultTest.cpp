// For every public operation: each allocation that it makes, and each that the engine makes for it,
// fails in turn. The answer is a documented one, nothing is lost, the object works afterwards and
// the file is as it was.

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "support/Engine.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <functional>
#include <memory>
#include <new>
#include <ostream>

using namespace kxtest;

namespace
{

// Longer than what a string holds in itself, so that each copy is a request.
const std::string kName = "a-name-that-needs-memory-of-its-own";
const std::string kValue = "a value that needs memory of its own as well";
const std::string kKey = "cfg." + kName + "@" + kName + "=1";
const std::string kRest = kKey.substr(4);
const std::string kXPath = "/cfg/" + kName + "[@" + kName + "='1']";
const std::string kXml =
    "<cfg><" + kName + " " + kName + "=\"1\">" + kValue + "</" + kName + "><b/></cfg>";

/** One of every object, ready for whatever operation. */
struct Objects
{
    explicit Objects(const std::string& path) : file(path), reader(path), writer(path)
    {
        parser.ParseXml(path);
        root = parser.GetRootNode();
        node = root.FirstChild();
    }

    xmlNodePtr ReadersRoot()
    {
        return xmlDocGetRootElement(static_cast<xmlDocPtr>(reader.GetDataPtr()));
    }

    const std::string file;
    CXMLReader reader;
    CXMLWriter writer;
    CXmlParser parser;
    CXmlNode root;
    CXmlNode node;
};

using Run = std::function<std::string(Objects&)>;

struct Operation
{
    const char* name;
    Run run; ///< @return what is to be seen of the operation

    /** What it may also answer when memory runs out. */
    std::vector<std::string> whenShort = {};

    /** What is to be seen when it succeeded and is called once more, if that differs. */
    std::string again = "";

    /** Engine buffers that stay allocated by contract. */
    long kept = 0;
};

std::ostream& operator<<(std::ostream& out, const Operation& operation)
{
    return out << operation.name;
}

std::string Of(int status)
{
    return std::to_string(status);
}
std::string Of(const void* pointer)
{
    return pointer == nullptr ? "null" : "made";
}
std::string Of(CXmlNode handle)
{
    return handle.IsNull() ? "null" : handle.Name();
}
std::string Of(const std::list<CXmlNode>& handles)
{
    std::string names;
    for (const CXmlNode& handle : handles)
    {
        names += Of(handle) + ' ';
    }
    return names;
}

/** Destroys what a factory made, as its client would. */
template <class Object>
std::string OfMade(Object* made)
{
    const std::unique_ptr<Object> owner(made);
    return Of(static_cast<const void*>(made));
}

// --- The operations

std::string ParseAgain(Objects& objects)
{
    // The earlier document is not freed, by contract; it is the client's then.
    const auto earlier = static_cast<xmlDocPtr>(objects.reader.GetDataPtr());
    const int status = objects.reader.ParseFile(objects.file);
    xmlFreeDoc(earlier);
    return Of(status);
}

/** A writer on a document that a reader owns: whatever happens, it lets go of it. */
class Borrower
{
public:
    explicit Borrower(CXMLReader& reader) { m_writer.SetDataPtr(reader.GetDataPtr()); }
    ~Borrower() { m_writer.SetDataPtr(nullptr); }
    Borrower(const Borrower&) = delete;
    Borrower& operator=(const Borrower&) = delete;

    int SetValue() { return m_writer.SetValue(kKey, kValue); }

private:
    CXMLWriter m_writer;
};

std::string Query(Objects& objects)
{
    // To name what is seen can need memory as well.
    const std::unique_ptr<xmlXPathObject, void (*)(xmlXPathObjectPtr)> result(
        objects.parser.GetNodeSet(kXPath, objects.root), xmlXPathFreeObject);
    return Of(static_cast<const void*>(result.get()));
}

std::string CreateNew(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    const int status = objects.parser.CreateNewXmlDoc(kName);
    return Of(status);
}

std::string Load(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    return Of(objects.parser.ParseXml(objects.file));
}

std::string Clear(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    objects.parser.ClearDocument();
    return Of(objects.parser.GetRootNode());
}

// Text that the engine has no memory for is missing without a word, and an empty element is not
// filled by a later update.
const char* const kEmptied = "-2";

// An exception that leaves FindAllNodes leaves the engine's result behind: object, set and table.
const long kXPathResult = 3;

const Operation kStore[] = {
    // Short of memory the engine may also answer a document without a root, or a root without a
    // name, which is foreign to every key.
    {"CXMLReader", [](Objects& o) { return Of(CXMLReader(o.file).GetDataPtr()); }, {"null"}},
    {"GetCXMLReaderObject",
     [](Objects& o) { return OfMade(GetCXMLReaderObject(o.file.c_str())); },
     {"null"}},
    {"ReaderParseFile", ParseAgain, {"22"}},
    {"GetValue", [](Objects& o) { return o.reader.GetValue(kKey); }, {""}},
    {"GetValueInto",
     [](Objects& o)
     {
         std::string value = kName;
         const int status = o.reader.GetValue(kKey, value);
         return Of(status) + value;
     },
     {"-2" + kName}},
    {"GetValueInPlace",
     [](Objects& o)
     {
         std::string value = kKey;
         const int status = o.reader.GetValue(value, value);
         return Of(status) + value;
     },
     {"-2" + kKey}},
    {"XMLGetValue", [](Objects& o) { return o.reader.XMLGetValue(o.ReadersRoot(), kRest); }, {""}},
    {"XMLGetValueInto",
     [](Objects& o)
     {
         std::string value;
         unsigned found = 0;
         const int status = o.reader.XMLGetValue(o.ReadersRoot(), kRest, value, found);
         return Of(status) + value + Of(static_cast<int>(found));
     },
     {"-20"}},
    {"GetDataPtr", [](Objects& o) { return Of(o.reader.GetDataPtr()); }},
    {"CXMLWriter",
     [](Objects& o) { return Of(CXMLWriter(o.file).SetValue("cfg.b", "")); },
     {"7", "22", "0"}},
    {"CXMLWriterWithoutPath", [](Objects&) { return Of(CXMLWriter().SetValue("cfg.b", "")); }},
    {"GetCXMLWriterObject",
     [](Objects& o) { return OfMade(GetCXMLWriterObject(o.file.c_str())); },
     {"null"}},
    {"GetCXMLWriterObjectNoParam",
     [](Objects&) { return OfMade(GetCXMLWriterObjectNoParam()); },
     {"null"}},
    {"WriterParseFile", [](Objects& o) { return Of(o.writer.ParseFile(o.file)); }, {"22"}},
    {"SetPath", [](Objects& o) { return Of(o.writer.SetPath(o.file)); }},
    {"SetDataPtr", [](Objects& o) { return Of(Borrower(o.reader).SetValue()); }, {"-2"}, kEmptied},
    {"SetValue", [](Objects& o) { return Of(o.writer.SetValue(kKey, kValue)); }, {"-2"}, kEmptied},
    {"XMLSetValue",
     [](Objects& o)
     {
         std::string value = kValue;
         unsigned updated = 0;
         const int status = o.writer.XMLSetValue(o.ReadersRoot(), kRest, value, updated);
         return Of(status) + Of(static_cast<int>(updated));
     },
     {"00"},
     "00"},
};

const Operation kToolkit[] = {
    {"CXmlParser", [](Objects&) { return Of(CXmlParser().GetRootNode()); }},
    {"ClearDocument", Clear},
    {"ParseXml", Load, {"22"}},
    {"CreateNewXmlDoc", CreateNew, {"22"}},
    {"GetRootNode", [](Objects& o) { return Of(o.parser.GetRootNode()); }},
    {"IsReadable", [](Objects& o) { return Of(o.parser.IsReadable(o.file)); }},
    {"AddNewNode",
     [](Objects& o) { return Of(o.parser.AddNewNode(o.node, kName, kValue)); },
     {"null"}},
    {"RemoveNode", [](Objects& o) { return Of(o.parser.RemoveNode(o.root.LastChild())); }},
    {"CopiedHandle", [](Objects& o) { return Of(CXmlNode(o.node)); }},
    {"IsNull", [](Objects& o) { return Of(o.node.IsNull()); }},
    {"Type", [](Objects& o) { return Of(o.node.Type()); }},
    {"Name", [](Objects& o) { return o.node.Name(); }},
    {"Parent", [](Objects& o) { return Of(o.node.Parent()); }},
    {"FirstChild", [](Objects& o) { return Of(o.root.FirstChild()); }},
    {"LastChild", [](Objects& o) { return Of(o.root.LastChild()); }},
    {"NextSibling", [](Objects& o) { return Of(o.node.NextSibling()); }},
    {"PrevSibling", [](Objects& o) { return Of(o.node.PrevSibling()); }},
    {"ClearNode", [](Objects& o) { return Of(o.node.ClearNode()); }},
    {"GetContent", [](Objects& o) { return o.node.GetContent(); }, {""}, "", 1},
    {"SetContent", [](Objects& o) { return Of(o.node.SetContent(kValue)); }},
    {"GetContentOfChildNode",
     [](Objects& o)
     {
         std::string value;
         const int status = o.root.GetContentOfChildNode(kName, value);
         return Of(status) + value;
     },
     {"0"},
     "",
     1},
    {"Children", [](Objects& o) { return Of(o.root.Children()); }},
    {"FindChildNode", [](Objects& o) { return Of(o.root.FindChildNode(kName)); }},
    {"FindAllChildNodes", [](Objects& o) { return Of(o.root.FindAllChildNodes(kName)); }},
    {"AddChildNode", [](Objects& o) { return Of(o.node.AddChildNode(kName, kValue)); }, {"null"}},
    {"AddSiblingNode",
     [](Objects& o) { return Of(o.node.AddSiblingNode(kName, kValue)); },
     {"null"}},
    {"RemoveChildNode", [](Objects& o) { return Of(o.root.RemoveChildNode("b")); }, {}, "22"},
    {"AddNewAttribute",
     [](Objects& o) { return Of(o.node.AddNewAttribute(kName, kValue)); },
     {"22"}},
    {"GetAttributeValue",
     [](Objects& o)
     {
         std::string value;
         const int status = o.node.GetAttributeValue(kName, value);
         return Of(status) + value;
     },
     {"22"}},
    {"GetAttributeItems",
     [](Objects& o)
     {
         std::string seen;
         for (const CXmlAttr& item : o.node.GetAttributeItems())
         {
             seen += item.m_strName + item.m_strValue;
         }
         return seen;
     }},
    {"RemoveAttribute", [](Objects& o) { return Of(o.node.RemoveAttribute(kName)); }},
    {"SetAttributeValue", [](Objects& o) { return Of(o.node.SetAttributeValue(kName, kValue)); }},
    {"CXmlAttr", [](Objects&) { return CXmlAttr(kName, kValue).m_strValue; }},
};

// Short of memory the engine itself falls over them; the requests of operator new are tried.
const Operation kQueries[] = {
    {"GetNodeSet", Query},
    {"FindNode", [](Objects& o) { return Of(o.parser.FindNode(kXPath, o.root)); }},
    {"FindAllNodes",
     [](Objects& o) { return Of(o.parser.FindAllNodes(kXPath, o.root)); },
     {},
     "",
     kXPathResult},
};

const char* const kThrown = "std::bad_alloc";

std::string Seen(const Operation& operation, Objects& objects)
{
    try
    {
        return operation.run(objects);
    }
    catch (const std::bad_alloc&)
    {
        return kThrown;
    }
}

class FaultTest : public testing::TestWithParam<Operation>
{
protected:
    FaultTest()
    {
        Objects objects(m_file);
        m_good = Seen(GetParam(), objects);
    }

    /** Performs the operation again and again, each time with the next request failing. */
    template <class Faults>
    void FailInTurn()
    {
        constexpr std::size_t kEnough = 5000;
        std::size_t n = 1;
        while (n != kEnough && Fail<Faults>(n))
        {
            ++n;
        }
        EXPECT_NE(kEnough, n) << "it never succeeds";
        RecordProperty("requests", static_cast<int>(n - 1));
    }

private:
    /** @return whether the operation came to its n-th request, which then failed. */
    template <class Faults>
    bool Fail(std::size_t n)
    {
        SCOPED_TRACE("request " + std::to_string(n) + " fails");
        const EngineMemory memory;
        const NewCounter heap;
        bool failed = false;
        {
            Objects objects(m_file);
            Faults::FailAt(n);
            const std::string seen = Seen(GetParam(), objects);
            failed = Faults::Failed();
            Faults::FailAt(0);
            TakeEngineErrors();
            CheckAnswer(seen, failed);
            CheckUsable(objects);
        }
        EXPECT_EQ(kXml, ReadFile(m_file));
        EXPECT_EQ(0, heap.Live());
        const long lost = memory.Live();
        EXPECT_TRUE(lost >= 0 && lost <= 2 * GetParam().kept) << lost;
        return failed;
    }

    void CheckAnswer(const std::string& seen, bool failed)
    {
        std::vector<std::string> answers = {m_good};
        if (failed)
        {
            answers.insert(answers.end(), GetParam().whenShort.begin(), GetParam().whenShort.end());
            answers.push_back(kThrown);
        }
        EXPECT_THAT(answers, testing::Contains(seen));
    }

    void CheckUsable(Objects& objects)
    {
        const std::string again = Seen(GetParam(), objects);
        EXPECT_TRUE(again == m_good || again == GetParam().again) << again;
    }

    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", kXml);
    std::string m_good;
};

class QueryFaultTest : public FaultTest
{
};

std::string NameOf(const testing::TestParamInfo<Operation>& info)
{
    return info.param.name;
}

} // namespace

TEST_P(FaultTest, OfTheHeap)
{
    FailInTurn<NewCounter>();
}

TEST_P(FaultTest, OfTheEnginesMemory)
{
    FailInTurn<EngineMemory>();
}

TEST_P(QueryFaultTest, OfTheHeap)
{
    FailInTurn<NewCounter>();
}

INSTANTIATE_TEST_SUITE_P(Store, FaultTest, testing::ValuesIn(kStore), NameOf);
INSTANTIATE_TEST_SUITE_P(Toolkit, FaultTest, testing::ValuesIn(kToolkit), NameOf);
INSTANTIATE_TEST_SUITE_P(Toolkit, QueryFaultTest, testing::ValuesIn(kQueries), NameOf);

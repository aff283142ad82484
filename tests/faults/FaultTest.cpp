// For every public operation: each allocation that it makes, and each that the engine makes for it,
// fails in turn. The answer is a documented one, nothing is lost, the object works afterwards and
// the file is as it was.

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "file/GuestWriter.h"

#include "support/Engine.h"
#include "support/Expect.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <algorithm>
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

/** What is to be seen of an operation. */
struct Answer
{
    int status = 0;        ///< the result, if it is a number
    std::string text = ""; ///< the result, if it is a text, and what is written to an argument
    bool found = false;    ///< the flag of the walks of keys
    bool thrown = false;   ///< std::bad_alloc left the operation
};

bool operator==(const Answer& left, const Answer& right)
{
    return left.status == right.status && left.text == right.text && left.found == right.found &&
           left.thrown == right.thrown;
}

std::ostream& operator<<(std::ostream& out, const Answer& answer)
{
    out << answer.status << " \"" << answer.text << '"';
    return out << (answer.found ? " found" : "") << (answer.thrown ? " thrown" : "");
}

struct Operation
{
    const char* name;
    std::function<Answer(Objects&)> run;

    /** What it may also answer when memory runs out. */
    std::vector<Answer> whenShort = {};

    /** What it answers when it succeeded and is called once more, if that differs. */
    std::vector<Answer> again = {};

    /** Engine buffers that stay allocated by contract. */
    long kept = 0;
};

std::ostream& operator<<(std::ostream& out, const Operation& operation)
{
    return out << operation.name;
}

Answer Of(int status)
{
    return {status};
}
Answer Of(const std::string& text)
{
    return {0, text};
}
Answer Of(const void* pointer)
{
    return {0, pointer == nullptr ? "null" : "made"};
}
Answer Of(CXmlNode handle)
{
    return {0, handle.IsNull() ? "null" : handle.Name()};
}
Answer Of(const std::list<CXmlNode>& handles)
{
    Answer answer;
    for (const CXmlNode& handle : handles)
    {
        answer.text += Of(handle).text + ' ';
    }
    return answer;
}

const Answer kNull = Of(static_cast<const void*>(nullptr));
const Answer kThrown = {0, "", false, true};

/** Destroys what a factory made, as its client would. */
template <class Object>
Answer OfMade(Object* made)
{
    const std::unique_ptr<Object> owner(made);
    return Of(static_cast<const void*>(made));
}

// --- The operations

Answer ParseAgain(Objects& objects)
{
    // The earlier document is not freed, by contract; it is the client's then.
    const auto earlier = static_cast<xmlDocPtr>(objects.reader.GetDataPtr());
    const int status = objects.reader.ParseFile(objects.file);
    xmlFreeDoc(earlier);
    return Of(status);
}

Answer Query(Objects& objects)
{
    // To name what is seen can need memory as well.
    const std::unique_ptr<xmlXPathObject, void (*)(xmlXPathObjectPtr)> result(
        objects.parser.GetNodeSet(kXPath, objects.root), xmlXPathFreeObject);
    return Of(static_cast<const void*>(result.get()));
}

Answer CreateNew(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    const int status = objects.parser.CreateNewXmlDoc(kName);
    return Of(status);
}

Answer Load(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    return Of(objects.parser.ParseXml(objects.file));
}

Answer Clear(Objects& objects)
{
    objects.root = objects.node = CXmlNode();
    objects.parser.ClearDocument();
    return Of(objects.parser.GetRootNode());
}

// Text that the engine has no memory for is dropped without an error, and a later update does not
// fill an empty element.
const Answer kEmptied = {-2};

// An exception that leaves FindAllNodes leaves the engine's result behind: object, set and table.
const long kXPathResult = 3;

const Operation kStore[] = {
    // Short of memory the engine may also answer a document without a root, or a root without a
    // name, which is foreign to every key.
    {"CXMLReader", [](Objects& o) { return Of(CXMLReader(o.file).GetDataPtr()); }, {kNull}},
    {"GetCXMLReaderObject",
     [](Objects& o) { return OfMade(GetCXMLReaderObject(o.file.c_str())); },
     {kNull}},
    {"ReaderParseFile", ParseAgain, {{22}}},
    {"GetValue", [](Objects& o) { return Of(o.reader.GetValue(kKey)); }, {{}}},
    {"GetValueInto",
     [](Objects& o)
     {
         std::string value = kName;
         const int status = o.reader.GetValue(kKey, value);
         return Answer{status, value};
     },
     {{-2, kName}}},
    {"GetValueInPlace",
     [](Objects& o)
     {
         std::string value = kKey;
         const int status = o.reader.GetValue(value, value);
         return Answer{status, value};
     },
     {{-2, kKey}}},
    {"XMLGetValue",
     [](Objects& o) { return Of(o.reader.XMLGetValue(o.ReadersRoot(), kRest)); },
     {{}}},
    {"XMLGetValueInto",
     [](Objects& o)
     {
         std::string value;
         unsigned found = 0;
         const int status = o.reader.XMLGetValue(o.ReadersRoot(), kRest, value, found);
         return Answer{status, value, found != 0};
     },
     {{-2}}},
    {"GetDataPtr", [](Objects& o) { return Of(o.reader.GetDataPtr()); }},
    {"CXMLWriter",
     [](Objects& o) { return Of(CXMLWriter(o.file).SetValue("cfg.b", "")); },
     {{7}, {22}, {0}}},
    {"CXMLWriterWithoutPath", [](Objects&) { return Of(CXMLWriter().SetValue("cfg.b", "")); }},
    {"GetCXMLWriterObject",
     [](Objects& o) { return OfMade(GetCXMLWriterObject(o.file.c_str())); },
     {kNull}},
    {"GetCXMLWriterObjectNoParam",
     [](Objects&) { return OfMade(GetCXMLWriterObjectNoParam()); },
     {kNull}},
    {"WriterParseFile", [](Objects& o) { return Of(o.writer.ParseFile(o.file)); }, {{22}}},
    {"SetPath", [](Objects& o) { return Of(o.writer.SetPath(o.file)); }},
    {"SetDataPtr",
     [](Objects& o) { return Of(GuestWriter(o.reader).Get().SetValue(kKey, kValue)); },
     {{-2}},
     {kEmptied}},
    {"SetValue",
     [](Objects& o) { return Of(o.writer.SetValue(kKey, kValue)); },
     {{-2}},
     {kEmptied}},
    {"XMLSetValue",
     [](Objects& o)
     {
         std::string value = kValue;
         unsigned updated = 0;
         const int status = o.writer.XMLSetValue(o.ReadersRoot(), kRest, value, updated);
         return Answer{status, "", updated != 0};
     },
     {{0}},
     {{0}}},
};

const Operation kToolkit[] = {
    {"CXmlParser", [](Objects&) { return Of(CXmlParser().GetRootNode()); }},
    {"ClearDocument", Clear},
    {"ParseXml", Load, {{22}}},
    {"CreateNewXmlDoc", CreateNew, {{22}}},
    {"GetRootNode", [](Objects& o) { return Of(o.parser.GetRootNode()); }},
    {"IsReadable", [](Objects& o) { return Of(o.parser.IsReadable(o.file)); }},
    {"AddNewNode",
     [](Objects& o) { return Of(o.parser.AddNewNode(o.node, kName, kValue)); },
     {kNull}},
    {"RemoveNode", [](Objects& o) { return Of(o.parser.RemoveNode(o.root.LastChild())); }},
    {"CopiedHandle", [](Objects& o) { return Of(CXmlNode(o.node)); }},
    {"IsNull", [](Objects& o) { return Of(o.node.IsNull()); }},
    {"Type", [](Objects& o) { return Of(o.node.Type()); }},
    {"Name", [](Objects& o) { return Of(o.node.Name()); }},
    {"Parent", [](Objects& o) { return Of(o.node.Parent()); }},
    {"FirstChild", [](Objects& o) { return Of(o.root.FirstChild()); }},
    {"LastChild", [](Objects& o) { return Of(o.root.LastChild()); }},
    {"NextSibling", [](Objects& o) { return Of(o.node.NextSibling()); }},
    {"PrevSibling", [](Objects& o) { return Of(o.node.PrevSibling()); }},
    {"ClearNode", [](Objects& o) { return Of(o.node.ClearNode()); }},
    {"GetContent", [](Objects& o) { return Of(o.node.GetContent()); }, {{}}, {}, 1},
    {"SetContent", [](Objects& o) { return Of(o.node.SetContent(kValue)); }},
    {"GetContentOfChildNode",
     [](Objects& o)
     {
         std::string value;
         const int status = o.root.GetContentOfChildNode(kName, value);
         return Answer{status, value};
     },
     {{0}},
     {},
     1},
    {"Children", [](Objects& o) { return Of(o.root.Children()); }},
    {"FindChildNode", [](Objects& o) { return Of(o.root.FindChildNode(kName)); }},
    {"FindAllChildNodes", [](Objects& o) { return Of(o.root.FindAllChildNodes(kName)); }},
    {"AddChildNode", [](Objects& o) { return Of(o.node.AddChildNode(kName, kValue)); }, {kNull}},
    {"AddSiblingNode",
     [](Objects& o) { return Of(o.node.AddSiblingNode(kName, kValue)); },
     {kNull}},
    {"RemoveChildNode", [](Objects& o) { return Of(o.root.RemoveChildNode("b")); }, {}, {{22}}},
    {"AddNewAttribute",
     [](Objects& o) { return Of(o.node.AddNewAttribute(kName, kValue)); },
     {{22}}},
    {"GetAttributeValue",
     [](Objects& o)
     {
         std::string value;
         const int status = o.node.GetAttributeValue(kName, value);
         return Answer{status, value};
     },
     {{22}}},
    {"GetAttributeItems",
     [](Objects& o)
     {
         std::string seen;
         for (const CXmlAttr& item : o.node.GetAttributeItems())
         {
             seen += item.m_strName + item.m_strValue;
         }
         return Of(seen);
     }},
    {"RemoveAttribute", [](Objects& o) { return Of(o.node.RemoveAttribute(kName)); }},
    {"SetAttributeValue", [](Objects& o) { return Of(o.node.SetAttributeValue(kName, kValue)); }},
    {"CXmlAttr", [](Objects&) { return Of(CXmlAttr(kName, kValue).m_strValue); }},
};

// The engine can crash when it runs out of memory in a query, so only operator new fails here.
const Operation kQueries[] = {
    {"GetNodeSet", Query},
    {"FindNode", [](Objects& o) { return Of(o.parser.FindNode(kXPath, o.root)); }},
    {"FindAllNodes",
     [](Objects& o) { return Of(o.parser.FindAllNodes(kXPath, o.root)); },
     {},
     {},
     kXPathResult},
};

Answer Seen(const Operation& operation, Objects& objects)
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
        std::size_t requests = 0;
        kxtest::FailInTurn(
            [&](std::size_t n)
            {
                const bool failed = Fail<Faults>(n);
                requests += failed;
                return failed;
            },
            0);
        RecordProperty("requests", static_cast<int>(requests));
    }

private:
    /** @return whether the operation came to its n-th request, which then failed. */
    template <class Faults>
    bool Fail(std::size_t n)
    {
        const EngineMemory memory;
        const NewCounter heap;
        bool failed = false;
        {
            Objects objects(m_file);
            Answer seen;
            failed = Failing<Faults>(n, [&] { seen = Seen(GetParam(), objects); });
            TakeEngineErrors();
            CheckAnswer(seen, failed);
            CheckUsable(objects);
        }
        EXPECT_EQ(kXml, ReadFile(m_file));
        EXPECT_EQ(0, heap.Live());
        const long lost = memory.Live();
        const long lostHere = lost - 2 * GetParam().kept;
        EXPECT_TRUE(lost >= 0 && lostHere <= LostByTheEngine()) << lost;
        return failed;
    }

    /** @return how many blocks the engine itself leaks at most when one request of a parse fails.
     */
    long LostByTheEngine() const
    {
        static const long lost = EngineVersion() < 20910 ? LostByAnOldEngine() : 0;
        return lost;
    }

    long LostByAnOldEngine() const
    {
        long most = 0;
        bool failed = true;
        for (std::size_t n = 1; failed; ++n)
        {
            const EngineMemory memory;
            failed = Failing<EngineMemory>(n, [&] { xmlFreeDoc(xmlParseFile(m_file.c_str())); });
            TakeEngineErrors();
            xmlCleanupParser(); // as every release of a document does
            most = std::max(most, memory.Live());
        }
        return most;
    }

    void CheckAnswer(const Answer& seen, bool failed)
    {
        std::vector<Answer> answers = {m_good};
        if (failed)
        {
            answers.insert(answers.end(), GetParam().whenShort.begin(), GetParam().whenShort.end());
            answers.push_back(kThrown);
        }
        EXPECT_THAT(answers, testing::Contains(seen));
    }

    void CheckUsable(Objects& objects)
    {
        std::vector<Answer> answers = GetParam().again;
        answers.push_back(m_good);
        EXPECT_THAT(answers, testing::Contains(Seen(GetParam(), objects)));
    }

    const TemporaryFolder m_folder;
    const std::string m_file = m_folder.Write("cfg.xml", kXml);
    Answer m_good;
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

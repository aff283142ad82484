// Handles, documents, XPath and saving, called in any order by a client that keeps to the contract.
//
// The input begins with strings, one a line, up to an empty line; they follow those below. Then
// come instructions of four bytes: what to do, a handle, and two strings or a further handle.

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "ConfinedEngine.h"
#include "Handles.h"

#include "model/MemoryFile.h"
#include "support/Log.h"
#include "support/Signature.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <dlfcn.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

using kxfuzz::Handles;

namespace
{

constexpr std::size_t kMostInstructions = 200;
constexpr std::size_t kMostBytesOfAString = 300;

const char* const kStrings[] = {
    // Names, contents, keys
    "", "a", "b", "n", "text", "comment", "a.b", "cfg.a", "cfg.a@n=1.b", "v", "x&amp;y", "&e;",
    "a&b", "&undefined;", "<x/>", "p:a", "xml:id", "i",
    // Documents
    "<cfg><a n='1'><b>v</b></a><a n='2'>w<b/></a></cfg>",
    "<cfg xmlns:p='u' xmlns='d'><p:a p:n='1'/> <!--c--><?pi x?><![CDATA[d]]></cfg>",
    "<!DOCTYPE cfg [<!ENTITY e 'mid'><!ENTITY t '<b>in</b>'>]><cfg n='x&e;y'>&e;<a>&t;</a></cfg>",
    "<!DOCTYPE cfg [<!ATTLIST a i ID #IMPLIED n CDATA 'd'><!ELEMENT a ANY>]><cfg><a i='i'/></cfg>",
    "<!--before--><cfg/><?after?>", "<cfg>", "",
    // XPath
    "//node()", "//@*", "/", "/node()", "//text()", "//namespace::*", "..", ".", "*", "//*[last()]",
    "ancestor::*", "following::node()", "preceding::node()|//@*", "count(//*)", "string(.)",
    "id('i')", "//node()/node()", "//[", "$x", "//a[@n='1']/b"};

// --- What GetContent leaves allocated, by contract, belongs to the client.

bool g_collectsContent = false;
std::vector<xmlChar*> g_contents;

} // namespace

extern "C" xmlChar* xmlNodeGetContent(kxtest::FirstOf<decltype(xmlNodeGetContent)> node)
{
    static const auto engine =
        reinterpret_cast<decltype(&xmlNodeGetContent)>(dlsym(RTLD_NEXT, "xmlNodeGetContent"));
    xmlChar* const content = engine(node);
    if (g_collectsContent && content != nullptr)
    {
        g_contents.push_back(content);
    }
    return content;
}

namespace
{

void Require(bool holds, const char* what)
{
    if (!holds)
    {
        std::fprintf(stderr, "%s\n", what);
        std::abort();
    }
}

/** Every link of a tree has its counterpart. */
void CheckLinks(xmlNodePtr parent)
{
    xmlNodePtr before = nullptr;
    for (xmlNodePtr child = parent->children; child != nullptr; child = child->next)
    {
        Require(child->parent == parent, "a child does not know its parent");
        Require(child->prev == before, "a child does not know its sibling");
        if (child->type == XML_ELEMENT_NODE)
        {
            CheckLinks(child);
        }
        before = child;
    }
    Require(parent->last == before, "a parent does not know its last child");
}

class Machine
{
public:
    explicit Machine(std::vector<std::string> strings) : m_strings(std::move(strings)) {}

    ~Machine()
    {
        ReleaseReader();
        m_parsers[0].reset();
        m_parsers[1].reset();
        for (xmlChar* const content : g_contents)
        {
            xmlFree(content);
        }
        g_contents.clear();
    }

    void Execute(const std::uint8_t* instruction)
    {
        m_slot = instruction[1];
        m_first = instruction[2];
        m_second = instruction[3];
        using Action = void (Machine::*)();
        static const Action actions[] = {
            // Documents
            &Machine::Load, &Machine::Create, &Machine::Clear, &Machine::Renew, &Machine::Root,
            &Machine::Save, &Machine::SaveWhereLoaded, &Machine::LoadReader, &Machine::Update,
            &Machine::LookUp,
            // XPath
            &Machine::Find, &Machine::Find, &Machine::FindAll, &Machine::FindAll,
            &Machine::Evaluate,
            // Handles
            &Machine::Copy, &Machine::Look, &Machine::Parent, &Machine::FirstChild,
            &Machine::LastChild, &Machine::NextSibling, &Machine::PrevSibling, &Machine::Children,
            &Machine::FindChild, &Machine::FindAllChildren, &Machine::ContentOfChild,
            // Changes
            &Machine::ClearNode, &Machine::SetContent, &Machine::AddChild, &Machine::AddSibling,
            &Machine::RemoveChild, &Machine::AddNew, &Machine::Remove, &Machine::AddAttribute,
            &Machine::ReadAttribute, &Machine::DoNothing, &Machine::SetMask};
        (this->*actions[instruction[0] % std::size(actions)])();
        m_log.Take();
        Handles::ListenToEngine();
    }

    /** What a client could do at last: every document is as whole as it looks. */
    void CheckDocuments()
    {
        for (std::size_t i = 0; i != std::size(m_parsers); ++i)
        {
            const CXmlNode document = Parser(i).FindNode("/", CXmlNode());
            if (Handles::NodeOf(document) != nullptr)
            {
                CheckLinks(Handles::NodeOf(document));
                Parser(i).SaveXml(NewFile(""));
            }
        }
    }

private:
    CXmlNode& Handle() { return m_handles.At(m_slot); }
    CXmlNode& OtherHandle() { return m_handles.At(m_second); }
    const std::string& First() const { return m_strings[m_first % m_strings.size()]; }
    const std::string& Second() const { return m_strings[m_second % m_strings.size()]; }
    CXmlParser& Parser(std::size_t index) { return *m_parsers[index % std::size(m_parsers)]; }
    CXmlParser& Parser() { return Parser(m_slot); }

    void Keep(const CXmlNode& handle) { m_handles.Put(m_second, handle); }

    void KeepAll(std::list<CXmlNode> handles)
    {
        std::size_t index = m_second;
        for (const CXmlNode& handle : handles)
        {
            m_handles.Put(index++, handle);
        }
    }

    const std::string& NewFile(const std::string& content)
    {
        m_files.push_back(std::make_unique<kxmodel::MemoryFile>(content));
        return m_files.back()->Path();
    }

    // --- Documents

    void WatchRoot() { m_handles.Watch(m_slot, Handles::NodeOf(Parser().GetRootNode())); }

    void Load()
    {
        Parser().ParseXml(NewFile(First()));
        WatchRoot();
    }
    void Create()
    {
        Parser().CreateNewXmlDoc(First());
        WatchRoot();
    }
    void Clear()
    {
        Parser().ClearDocument();
        Require(Parser().GetRootNode().IsNull(), "a cleared document has a root");
    }
    void Renew() { m_parsers[m_slot % std::size(m_parsers)] = std::make_unique<CXmlParser>(); }
    void Root()
    {
        const CXmlNode root = Parser().GetRootNode();
        // The recorded root may have been freed and its place taken by another node.
        if (m_handles.Watched(m_slot) == Handles::NodeOf(root))
        {
            Keep(root);
        }
    }
    void Save() { Parser().SaveXml(NewFile("")); }
    void SaveWhereLoaded() { Parser().SaveXml(""); }

    // --- The key-path store on a document that handles point into

    void ReleaseReader()
    {
        xmlFreeDoc(static_cast<xmlDocPtr>(m_reader.GetDataPtr()));
        m_reader.ParseFile("/proc/self/fd/none");
    }
    void LoadReader()
    {
        ReleaseReader();
        m_reader.ParseFile(NewFile(First()));
        const auto document = static_cast<xmlDocPtr>(m_reader.GetDataPtr());
        Keep(CXmlNode(document != nullptr ? xmlDocGetRootElement(document) : nullptr));
    }
    void Update()
    {
        CXMLWriter writer;
        writer.SetDataPtr(m_reader.GetDataPtr());
        writer.SetPath(NewFile(""));
        writer.SetValue(First(), Second());
        writer.SaveData();
        writer.SetDataPtr(nullptr);
    }
    void LookUp()
    {
        std::string value = Second();
        m_reader.GetValue(First(), value);
        m_reader.GetValue(First());
    }

    // --- XPath

    void Find() { Keep(Parser(m_second).FindNode(First(), Handle())); }

    /** @return the number of nodes that the string selects; -1 if it selects none. */
    int Evaluate(bool keep)
    {
        const xmlXPathObjectPtr result = Parser(m_second).GetNodeSet(First(), Handle());
        const int count = result != nullptr && result->nodesetval != nullptr
                              ? xmlXPathNodeSetGetLength(result->nodesetval)
                              : -1;
        for (int i = 0; keep && i < count && i < 4; ++i)
        {
            const xmlNodePtr node = xmlXPathNodeSetItem(result->nodesetval, i);
            if (node->type != XML_NAMESPACE_DECL) // which dies with the result
            {
                m_handles.Put(m_second + static_cast<std::size_t>(i), CXmlNode(node));
            }
        }
        xmlXPathFreeObject(result);
        return count;
    }
    void Evaluate() { Evaluate(true); }

    void FindAll()
    {
        if (Evaluate(false) < 256) // with more it does not return
        {
            KeepAll(Parser(m_second).FindAllNodes(First(), Handle()));
        }
    }

    // --- Handles

    void Copy() { Keep(Handle()); }
    void Look()
    {
        Handle().Type();
        Handle().Name();
        Handle().IsNull();
        g_collectsContent = true;
        Handle().GetContent();
        g_collectsContent = false;
        Handle().GetAttributeItems();
    }
    void Parent() { Keep(Handle().Parent()); }
    void FirstChild() { Keep(Handle().FirstChild()); }
    void LastChild() { Keep(Handle().LastChild()); }
    void NextSibling() { Keep(Handle().NextSibling()); }
    void PrevSibling() { Keep(Handle().PrevSibling()); }
    void Children() { KeepAll(Handle().Children()); }
    void FindChild() { Keep(Handle().FindChildNode(First())); }
    void FindAllChildren() { KeepAll(Handle().FindAllChildNodes(First())); }
    void ContentOfChild()
    {
        std::string value;
        g_collectsContent = true;
        Handle().GetContentOfChildNode(First(), value);
        g_collectsContent = false;
    }

    // --- Changes

    void ClearNode() { Handle().ClearNode(); }
    void SetContent() { Handle().SetContent(First()); }
    void AddChild() { Keep(Handle().AddChildNode(First(), Second())); }
    void AddSibling() { Keep(Handle().AddSiblingNode(First(), Second())); }
    void RemoveChild() { Handle().RemoveChildNode(First()); }
    void AddNew() { Keep(Parser(m_second).AddNewNode(Handle(), First(), Second())); }
    void Remove()
    {
        // Its copy of the handle dies after the node: a destructor does not look at it.
        Parser(m_second).RemoveNode(Handle());
    }
    void AddAttribute() { Handle().AddNewAttribute(First(), Second()); }
    void ReadAttribute()
    {
        std::string value;
        Handle().GetAttributeValue(First(), value);
    }
    void DoNothing()
    {
        Require(Handle().RemoveAttribute(First()) == 0, "RemoveAttribute failed");
        Require(Handle().SetAttributeValue(First(), Second()) == 0, "SetAttributeValue failed");
    }
    void SetMask()
    {
        kxtest::LogRecorder::SetMask(m_first % 2 == 0 ? kxtest::kMaskAll : kxtest::kMaskNone);
    }

    std::size_t m_slot = 0;
    std::size_t m_first = 0;
    std::size_t m_second = 0;
    std::vector<std::string> m_strings;
    kxtest::LogRecorder m_log;
    Handles m_handles;
    std::vector<std::unique_ptr<kxmodel::MemoryFile>> m_files;
    std::unique_ptr<CXmlParser> m_parsers[2] = {std::make_unique<CXmlParser>(),
                                                std::make_unique<CXmlParser>()};
    CXMLReader m_reader;
};

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    kxfuzz::ConfineEngine();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    std::vector<std::string> strings(std::begin(kStrings), std::end(kStrings));
    std::string line;
    std::size_t position = 0;
    while (position != size)
    {
        const char byte = static_cast<char>(data[position++]);
        if (byte != '\n')
        {
            line += byte;
        }
        else if (line.empty())
        {
            break;
        }
        else
        {
            strings.push_back(line.substr(0, kMostBytesOfAString));
            line.clear();
        }
    }
    Machine machine(strings);
    for (std::size_t i = 0; i != kMostInstructions && size - position >= 4; ++i, position += 4)
    {
        machine.Execute(data + position);
    }
    machine.CheckDocuments();
    return 0;
}

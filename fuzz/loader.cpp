// A file, as every loader meets it. The input is the file.

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "ConfinedEngine.h"

#include "model/MemoryFile.h"
#include "support/Log.h"

#include <libxml/parser.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

namespace
{

constexpr std::size_t kMostNodes = 200;

void Require(bool holds, const char* what)
{
    if (!holds)
    {
        std::fprintf(stderr, "%s\n", what);
        std::abort();
    }
}

std::string NameOf(const xmlNode* node)
{
    return reinterpret_cast<const char*>(node->name);
}

/**
 * @return whether the engine loads what it saves for @p document. Older engines do not escape
 *         markup in the name of a namespace.
 */
bool LoadsAgain(xmlDocPtr document)
{
    xmlChar* text = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(document, &text, &size, "UTF-8");
    const xmlDocPtr again =
        xmlReadMemory(reinterpret_cast<const char*>(text), size, nullptr, nullptr, 0);
    xmlFree(text);
    xmlFreeDoc(again);
    return again != nullptr;
}

/** Reads and changes what the document holds by keys that are made of its names. */
bool UseStore(const std::string& path)
{
    const std::unique_ptr<CXMLReader> reader(GetCXMLReaderObject(path.c_str()));
    const std::unique_ptr<CXMLWriter> writer(GetCXMLWriterObject(path.c_str()));
    std::string value;
    const auto document = static_cast<xmlDocPtr>(reader->GetDataPtr());
    if (document == nullptr)
    {
        Require(reader->GetValue("a.b", value) == 22, "a lookup without a document succeeded");
        Require(writer->SetValue("a.b", value) == 7, "an update without a document succeeded");
        Require(writer->SaveData() == -2, "nothing was saved, with success");
        return false;
    }
    const xmlNode* const root = xmlDocGetRootElement(document);
    for (const xmlNode* node = root->children; node != nullptr; node = node->next)
    {
        if (node->type == XML_ELEMENT_NODE)
        {
            const std::string key = NameOf(root) + "." + NameOf(node);
            const int status = reader->GetValue(key + "@n=1." + NameOf(node), value);
            Require(status == 0 || status == -2, "a lookup failed");
            reader->GetValue(key);
            writer->SetValue(key, "new");
        }
    }
    const kxmodel::MemoryFile target("");
    writer->SetPath(target.Path());
    Require(writer->SaveData() == 0, "a document that loads was not saved");
    const bool loadsAgain = LoadsAgain(document);
    Require(writer->ParseFile(target.Path()) == 0 || !loadsAgain, "it is saved and does not load");
    return loadsAgain;
}

/** Visits nodes from @p node on, in document order, as a client would. */
void Walk(CXmlNode node, std::size_t& visited)
{
    for (; !node.IsNull() && visited != kMostNodes; node = node.NextSibling())
    {
        ++visited;
        node.Name();
        node.Type();
        for (const CXmlAttr& item : node.GetAttributeItems())
        {
            std::string value;
            Require(node.GetAttributeValue(item.m_strName, value) == 0, "an attribute has gone");
        }
        Walk(node.FirstChild(), visited);
    }
}

bool UseDocument(const std::string& path, bool loadsAgain)
{
    CXmlParser parser;
    const int status = parser.ParseXml(path);
    Require(status == 0 || status == 22, "a file that can be opened was not");
    Require(parser.GetRootNode().IsNull() == (status != 0), "a document without a root, or worse");
    std::size_t visited = 0;
    Walk(parser.GetRootNode(), visited);
    Require(!parser.FindNode("/", CXmlNode()).IsNull() == (status == 0), "no document to query");
    const kxmodel::MemoryFile target("");
    Require(parser.SaveXml(target.Path()) == (status == 0 ? 0 : 22), "saving went otherwise");
    Require(!loadsAgain || parser.ParseXml(target.Path()) == 0, "it is saved and does not load");
    return status == 0;
}

bool Loads(const std::string& path)
{
    CXMLReader reader;
    return reader.ParseFile(path) == 0;
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    kxfuzz::ConfineEngine();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const kxtest::LogRecorder log;
    const kxmodel::MemoryFile file(std::string(reinterpret_cast<const char*>(data), size));
    const bool loads = Loads(file.Path());
    const bool loadsAgain = UseStore(file.Path());
    Require(UseDocument(file.Path(), loadsAgain) == loads,
            "one loader takes what the other refuses");
    return 0;
}

#include "DomTest.h"

#include <libxml/hash.h>
#include <libxml/parser.h>
#include <libxml/valid.h>
#include <libxml/xpath.h>

namespace kxtest
{

namespace
{

const char* const kDocument =
    "<cfg>lead<!--note--><name>box</name>mid"
    "<net id=\"1\" mode=\"on\"><port>1</port><port>2</port><Port>3</Port><empty/></net>"
    "<?target data?><last/></cfg>";

/** Whether @p node is @p first, a sibling behind it, or hangs below one of them. */
bool IsAmong(xmlNodePtr first, const void* node)
{
    for (xmlNodePtr here = first; here != nullptr; here = here->next)
    {
        const bool isElement = here->type == XML_ELEMENT_NODE;
        const bool isReference = here->type == XML_ENTITY_REF_NODE;
        if (here == node ||
            (isElement && IsAmong(reinterpret_cast<xmlNodePtr>(here->properties), node)) ||
            (!isReference && IsAmong(here->children, node)))
        {
            return true;
        }
    }
    return false;
}

// Called by the engine, whose older headers have the value writable.
template <class Char>
void AppendId(void* id, void* attributes, Char* /*value*/)
{
    static_cast<std::vector<const void*>*>(attributes)->push_back(static_cast<xmlIDPtr>(id)->attr);
}

} // namespace

bool IsIn(xmlDocPtr document, const void* node)
{
    return document == node || IsAmong(document->children, node);
}

std::vector<const void*> IdsOf(xmlDocPtr document)
{
    std::vector<const void*> attributes;
    xmlHashScan(static_cast<xmlHashTablePtr>(document->ids), AppendId, &attributes);
    return attributes;
}

void ExpectSoundIds(xmlDocPtr document)
{
    for (const void* const attribute : IdsOf(document))
    {
        EXPECT_TRUE(IsIn(document, attribute)) << "the table of IDs has a freed attribute";
    }
}

std::vector<std::string> Names(std::list<CXmlNode> nodes)
{
    std::vector<std::string> names;
    for (CXmlNode& node : nodes)
    {
        names.push_back(node.Name());
    }
    return names;
}

xmlDocPtr NewDocument(const char* root)
{
    const xmlDocPtr document = xmlNewDoc(nullptr);
    xmlDocSetRootElement(document, xmlNewNode(nullptr, reinterpret_cast<const xmlChar*>(root)));
    return document;
}

DomTest::DomTest() : m_document(ParseText(kDocument))
{
    xmlKeepBlanksDefault(1);
}

DomTest::~DomTest()
{
    for (const xmlDocPtr document : m_parsed)
    {
        xmlFreeDoc(document);
    }
    xmlFreeDoc(m_document);
    // The objects under test change it for the whole process.
    xmlKeepBlanksDefault(1);
}

xmlDocPtr DomTest::Parse(const std::string& xml)
{
    m_parsed.push_back(ParseText(xml));
    return m_parsed.back();
}

xmlNodePtr DomTest::NodeOf(xmlDocPtr document, const std::string& xpath)
{
    const xmlXPathContextPtr context = xmlXPathNewContext(document);
    const xmlXPathObjectPtr result =
        xmlXPathEvalExpression(reinterpret_cast<const xmlChar*>(xpath.c_str()), context);
    const xmlNodePtr node = xmlXPathNodeSetItem(result->nodesetval, 0);
    xmlXPathFreeObject(result);
    xmlXPathFreeContext(context);
    return node;
}

std::string DomTest::TextOf(xmlNodePtr node)
{
    const xmlBufferPtr buffer = xmlBufferCreate();
    xmlNodeDump(buffer, node->doc, node, 0, 0);
    const std::string text(reinterpret_cast<const char*>(xmlBufferContent(buffer)));
    xmlBufferFree(buffer);
    return text;
}

} // namespace kxtest

#include "DomTest.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

namespace kxtest
{

namespace
{

const char* const kDocument =
    "<cfg>lead<!--note--><name>box</name>mid"
    "<net id=\"1\" mode=\"on\"><port>1</port><port>2</port><Port>3</Port><empty/></net>"
    "<?target data?><last/></cfg>";

} // namespace

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

void DomTest::ExpectRecords(const Records& all, const std::function<void()>& operation)
{
    for (const unsigned mask : {kMaskAll, kMaskNone, kMaskWarning, kMaskError, kMaskTrace,
                                kMaskValue, kMaskXPath, kMaskError | kMaskXPath})
    {
        const unsigned long calls = LogRecorder::Calls();
        LogRecorder log(mask);
        operation();
        const Records records = log.Take();
        EXPECT_EQ(Under(mask, all), records) << "under mask " << std::hex << mask;
        EXPECT_EQ(calls + records.size(), LogRecorder::Calls());
    }
}

} // namespace kxtest

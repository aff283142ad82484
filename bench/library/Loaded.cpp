#include "library/Loaded.h"

#include "Documents.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <map>

namespace bench
{

std::shared_ptr<CXMLReader> LoadedReader(const std::string& path)
{
    static std::map<std::string, std::shared_ptr<CXMLReader>> readers;
    std::shared_ptr<CXMLReader>& reader = readers[path];
    if (!reader)
    {
        reader = std::make_shared<CXMLReader>(path);
    }
    return reader;
}

xmlDoc* LoadedDocument(const std::string& path)
{
    return static_cast<xmlDoc*>(LoadedReader(path)->GetDataPtr());
}

xmlNode* LoadedRoot(const std::string& path)
{
    return xmlDocGetRootElement(LoadedDocument(path));
}

std::shared_ptr<CXMLWriter> LoadedWriter(const std::string& path)
{
    // The reader keeps the document; the writer lets go of it before it is destroyed.
    const std::shared_ptr<CXMLWriter> writer(new CXMLWriter,
                                             [](CXMLWriter* detached)
                                             {
                                                 detached->SetDataPtr(nullptr);
                                                 delete detached;
                                             });
    writer->SetDataPtr(LoadedDocument(path));
    writer->SetPath(ScratchFile("saved.xml"));
    return writer;
}

std::shared_ptr<CXmlParser> LoadedParser(const std::string& path)
{
    static std::map<std::string, std::shared_ptr<CXmlParser>> parsers;
    std::shared_ptr<CXmlParser>& parser = parsers[path];
    if (!parser)
    {
        parser = std::make_shared<CXmlParser>();
        parser->ParseXml(path);
        // Its constructor makes every later parse drop blanks: other documents are to keep them.
        xmlKeepBlanksDefault(1);
    }
    return parser;
}

xmlDoc* ParserDocument(const std::string& path)
{
    xmlXPathObject* const root = LoadedParser(path)->GetNodeSet("/*", CXmlNode());
    xmlDoc* const document = root->nodesetval->nodeTab[0]->doc;
    xmlXPathFreeObject(root);
    return document;
}

} // namespace bench

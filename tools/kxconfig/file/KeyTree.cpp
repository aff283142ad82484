#include "file/KeyTree.h"

#include "engine/Node.h"

#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/parserInternals.h>

#include <utility>

namespace
{

struct ContextDeleter
{
    void operator()(xmlParserCtxt* context) const { xmlFreeParserCtxt(context); }
};

void RemoveAllButElements(const xmlNode* parent)
{
    for (xmlNode* node = parent->children; node != nullptr;)
    {
        xmlNode* const next = node->next;
        if (node->type != XML_ELEMENT_NODE)
        {
            xmlUnlinkNode(node);
            xmlFreeNode(node);
        }
        node = next;
    }
}

/** The handler of the end of an element. */
void EndElement(void* context, const xmlChar* name, const xmlChar* prefix, const xmlChar* space)
{
    const xmlNode* const element = static_cast<xmlParserCtxt*>(context)->node;
    xmlSAX2EndElementNs(context, name, prefix, space);
    if (element != nullptr && kx::OnlyTextChild(element) == nullptr)
    {
        RemoveAllButElements(element);
    }
}

/** @return the document; null if it is not well-formed. */
KeyTree Parse(const std::string& path)
{
    const std::unique_ptr<xmlParserCtxt, ContextDeleter> context(
        xmlCreateFileParserCtxt(path.c_str()));
    if (context == nullptr)
    {
        return nullptr;
    }
    xmlCtxtUseOptions(context.get(), XML_PARSE_COMPACT);
    context->sax->endElementNs = EndElement;
    xmlParseDocument(context.get());
    KeyTree document(context->myDoc);
    return context->wellFormed != 0 ? std::move(document) : nullptr;
}

} // namespace

KeyTree LoadKeyTree(const std::string& path, std::istream* standardInput)
{
    KeyTree document;
    LoadWith(
        [&](const std::string& file)
        {
            document = Parse(file);
            return document != nullptr;
        },
        path, standardInput);
    return document;
}

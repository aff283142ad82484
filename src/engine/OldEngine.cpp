#include "OldEngine.h"

#include <libxml/entities.h>
#include <libxml/parser.h>

#include <string.h>

namespace kx
{

// From 2.14 on the library has another name: no old engine can take its place.
#if LIBXML_VERSION < 21400

namespace
{

/** @return whether the engine turns the content of @p node into child nodes. */
bool HoldsNodes(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE || node->type == XML_ATTRIBUTE_NODE ||
           node->type == XML_DOCUMENT_FRAG_NODE;
}

const char* Find(const xmlChar* text, char wanted)
{
    return strchr(reinterpret_cast<const char*>(text), wanted);
}

void PrepareReferences(xmlDoc* document, const xmlChar* text);

/**
 * Creates the children of @p entity, as the engine does on its first use.
 *
 * The engine recurses into each entity without children, including the one that it is expanding.
 */
void MakeChildren(xmlEntity* entity)
{
    entity->children = reinterpret_cast<xmlNode*>(entity); // not null: it is being expanded
    PrepareReferences(entity->doc, entity->content);
    entity->children = xmlStringGetNodeList(entity->doc, entity->content);
    entity->owner = 1;
    for (xmlNode* child = entity->children; child != 0; child = child->next)
    {
        child->parent = reinterpret_cast<xmlNode*>(entity);
        entity->last = child;
    }
}

/** Creates the children of the entity of that name, if the engine would. */
void PrepareEntity(xmlDoc* document, const char* name, const char* end)
{
    xmlChar* const copy =
        xmlStrndup(reinterpret_cast<const xmlChar*>(name), static_cast<int>(end - name));
    xmlEntity* const entity = copy != 0 ? xmlGetDocEntity(document, copy) : 0;
    xmlFree(copy);
    if (entity != 0 && entity->etype != XML_INTERNAL_PREDEFINED_ENTITY && entity->children == 0)
    {
        MakeChildren(entity);
    }
}

/** Creates the children of every entity to which @p text refers; @p text may be null. */
void PrepareReferences(xmlDoc* document, const xmlChar* text)
{
    const char* reference = text != 0 ? Find(text, '&') : 0;
    while (reference != 0)
    {
        const char* next = reference + 1;
        const char* const end = strchr(next, ';');
        if (*next != '#' && end != 0)
        {
            PrepareEntity(document, next, end);
            next = end;
        }
        // The engine stops at a reference without ";".
        reference = end != 0 ? strchr(next, '&') : 0;
    }
}

/** Replaces the children of @p node by one text node, or by none if @p text is empty. */
void SetPlainContent(xmlNode* node, const xmlChar* text)
{
    xmlNodeSetContent(node, 0);
    if (*text != 0)
    {
        xmlAddChild(node, xmlNewDocText(node->doc, text));
    }
}

} // namespace

bool IsOldEngine()
{
    // The variable behind it is a macro up to 2.11, and a symbol of its own since.
    return strcmp(*__xmlParserVersion(), "20910") < 0;
}

void SetContent(xmlNode* node, const xmlChar* text)
{
    const bool needsHelp = IsOldEngine() && HoldsNodes(node);
    if (needsHelp && Find(text, '&') == 0)
    {
        SetPlainContent(node, text);
        return;
    }
    if (needsHelp)
    {
        PrepareReferences(node->doc, text);
    }
    xmlNodeSetContent(node, text);
}

xmlNode* NewElement(xmlDoc* document, xmlNs* space, const xmlChar* name, const xmlChar* content)
{
    if (content == 0 || !IsOldEngine())
    {
        return xmlNewDocNode(document, space, name, content);
    }
    xmlNode* const element = xmlNewDocNode(document, space, name, 0);
    if (element != 0)
    {
        SetContent(element, content);
    }
    return element;
}

#else

bool IsOldEngine()
{
    return false;
}

void SetContent(xmlNode* node, const xmlChar* text)
{
    xmlNodeSetContent(node, text);
}

xmlNode* NewElement(xmlDoc* document, xmlNs* space, const xmlChar* name, const xmlChar* content)
{
    return xmlNewDocNode(document, space, name, content);
}

#endif

} // namespace kx

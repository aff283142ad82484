#include "Kind.h"

namespace kx
{

namespace
{

/** Whether @p node is freed with what lies below, and nothing else points to either. */
bool OwnsWhatItHolds(const xmlNode* node)
{
    return HasContent(node) || node->type == XML_XINCLUDE_START || node->type == XML_XINCLUDE_END;
}

/** Whether @p node is in the tables of its DTD, too. */
bool IsDeclaration(const xmlNode* node)
{
    return node->type == XML_ELEMENT_DECL || node->type == XML_ATTRIBUTE_DECL ||
           node->type == XML_ENTITY_DECL;
}

/** Whether @p node declares an entity that references in the document may point to. */
bool IsGeneralEntity(const xmlNode* node)
{
    if (node->type != XML_ENTITY_DECL)
    {
        return false;
    }
    const xmlEntityType type = reinterpret_cast<const xmlEntity*>(node)->etype;
    return type != XML_INTERNAL_PARAMETER_ENTITY && type != XML_EXTERNAL_PARAMETER_ENTITY;
}

bool HasChild(const xmlNode* node, bool (*isWanted)(const xmlNode*))
{
    const xmlNode* child = node->children;
    while (child != 0 && !isWanted(child))
    {
        child = child->next;
    }
    return child != 0;
}

} // namespace

bool RefersToDeclaration(const xmlNode* node)
{
    return node->type == XML_ENTITY_REF_NODE && node->children != 0;
}

bool HasContent(const xmlNode* node)
{
    switch (node->type)
    {
    case XML_ELEMENT_NODE:
    case XML_ATTRIBUTE_NODE:
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_PI_NODE:
    case XML_COMMENT_NODE:
    case XML_DOCUMENT_FRAG_NODE:
        return true;
    default:
        return false;
    }
}

bool CanHoldChildren(const xmlNode* node)
{
    return node != 0 && (OwnsWhatItHolds(node) || IsDocument(node) || node->type == XML_DTD_NODE);
}

bool CanHaveSiblings(const xmlNode* node)
{
    // The siblings of an attribute are attributes: an element must not enter their chain.
    return node != 0 && !IsAttribute(node);
}

bool CanTakeContent(const xmlNode* node)
{
    return node != 0 && !RefersToDeclaration(node);
}

bool CanBeCleared(const xmlNode* node)
{
    if (node == 0)
    {
        return false;
    }
    switch (node->type)
    {
    case XML_DOCUMENT_NODE:
    case XML_HTML_DOCUMENT_NODE:
    case XML_ELEMENT_DECL:
    case XML_ATTRIBUTE_DECL:
        return true;
    case XML_ENTITY_REF_NODE:
        return !RefersToDeclaration(node);
    case XML_DTD_NODE:
        return !HasChild(node, IsDeclaration);
    default:
        return OwnsWhatItHolds(node);
    }
}

bool CanBeRemoved(const xmlNode* node)
{
    if (node == 0)
    {
        return false;
    }
    switch (node->type)
    {
    case XML_ENTITY_REF_NODE: // nothing points to it, regardless of its child
        return true;
    case XML_DTD_NODE:
        return !HasChild(node, IsGeneralEntity);
    default:
        return OwnsWhatItHolds(node);
    }
}

} // namespace kx

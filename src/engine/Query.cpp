#include "Query.h"

#include "Kind.h"
#include "OldEngine.h"
#include "Walk.h"

#include <string.h>

namespace kx
{

namespace
{

// --- Expressions

/** @return whether @p text starts with the axis @p name, or with @p name and "-or-self". */
bool StartsWithAxis(const char* text, const char* name)
{
    if (strncmp(text, name, strlen(name)) != 0)
    {
        return false;
    }
    text += strlen(name);
    text += strncmp(text, "-or-self", 8) == 0 ? 8 : 0;
    text += strspn(text, " \t\r\n");
    return strncmp(text, "::", 2) == 0;
}

/** @return the end of the literal that starts at @p text, else @p text. */
const char* SkipLiteral(const char* text)
{
    const char* const end = *text == '\'' || *text == '"' ? strchr(text + 1, *text) : 0;
    return end != 0 ? end : text;
}

/** @return whether @p expression has a step along the axis @p name. */
bool UsesAxis(const char* expression, const char* name)
{
    const char* at = expression;
    while (*at != 0 && !StartsWithAxis(at, name))
    {
        at = SkipLiteral(at) + 1;
    }
    return *at != 0;
}

// --- References

bool IsInsideAttribute(const xmlNode* node)
{
    const xmlNode* parent = LinkOf(node, &xmlNode::parent);
    while (parent != 0 && parent->type != XML_ATTRIBUTE_NODE)
    {
        parent = parent->parent;
    }
    return parent != 0;
}

/** @return whether an axis leads from @p node to a declaration; no axis enters attributes. */
bool LeadsToDeclaration(const xmlNode* node)
{
    return RefersToDeclaration(node) && !IsInsideAttribute(node);
}

/** @return the entity in whose declaration @p node is, or null. */
const xmlNode* EntityAround(const xmlNode* node)
{
    while (node != 0 && node->type != XML_ENTITY_DECL)
    {
        node = node->parent;
    }
    return node;
}

/** @return whether "preceding" leads from @p node to the declaration around it, or a later one. */
bool LeadsForward(const xmlNode* node)
{
    const xmlNode* const around = LeadsToDeclaration(node) ? EntityAround(node) : 0;
    const xmlNode* declared = around != 0 ? node->children : 0;
    while (declared != 0 && declared != around)
    {
        declared = declared->prev;
    }
    return declared != 0;
}

/** @return whether the last child of the last child, and so on, is a node that was met before. */
bool DescendsForever(const xmlNode* node)
{
    // One goes by two steps and meets the other in the circle, if there is one.
    const xmlNode* fast = node;
    do
    {
        node = node->last;
        fast = LinkOf(LinkOf(fast, &xmlNode::last), &xmlNode::last);
    } while (fast != 0 && fast != node);
    return fast != 0;
}

typedef bool (*NodeTest)(const xmlNode* node);

/** @return whether @p top, which may be null, or a node within it passes @p test. */
bool AnyWithin(xmlNode* top, NodeTest test)
{
    xmlNode* node = top;
    while (node != 0 && !test(node))
    {
        node = NextWithin(top, node);
    }
    return node != 0;
}

bool AnyOf(xmlDoc* document, NodeTest test)
{
    return document != 0 && (AnyWithin(reinterpret_cast<xmlNode*>(document), test) ||
                             AnyWithin(reinterpret_cast<xmlNode*>(document->extSubset), test));
}

/** @return whether a node of the query's document, or of its context's, passes @p test. */
bool AnyMet(const xmlXPathContext* context, NodeTest test)
{
    const xmlNode* const node = context->node;
    return AnyOf(context->doc, test) ||
           (node != 0 && node->type != XML_NAMESPACE_DECL && AnyOf(node->doc, test));
}

// --- Queries

/** @return whether the engine goes around in circles within a single step along an axis. */
bool NeverSteps(const xmlXPathContext* context, const char* expression)
{
    if (IsOldEngine() && IsInsideAttribute(context->node) && UsesAxis(expression, "ancestor"))
    {
        return true;
    }
    return UsesAxis(expression, "preceding") && AnyMet(context, DescendsForever);
}

/** @return whether an axis that @p expression uses can go around in circles. */
bool CanCircle(const xmlXPathContext* context, const char* expression)
{
    return (UsesAxis(expression, "following") && AnyMet(context, LeadsToDeclaration)) ||
           (UsesAxis(expression, "preceding") && AnyMet(context, LeadsForward));
}

#if LIBXML_VERSION >= 20910
/** More than any query needs that ends in practice, and seconds for one that does not. */
const unsigned long kMostSteps = 1000000000;

/** @return whether the engine can limit the steps of @p context, which it does then. */
bool LimitSteps(xmlXPathContext* context)
{
    // The records of an older engine are shorter than the headers say.
    const bool canLimit = !IsOldEngine();
    if (canLimit)
    {
        context->opLimit = kMostSteps;
    }
    return canLimit;
}
#else
bool LimitSteps(const xmlXPathContext* /*context*/)
{
    return false;
}
#endif

} // namespace

bool QueryEnds(xmlXPathContext* context, const char* expression)
{
    // An abbreviated step is along none of these axes.
    if (strchr(expression, ':') == 0)
    {
        return true;
    }
    return !NeverSteps(context, expression) &&
           (!CanCircle(context, expression) || LimitSteps(context));
}

} // namespace kx

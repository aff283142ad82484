#include "file/KeyTree.h"

#include "file/KeyTreeBuilder.h"

#include "KxLog.h"

#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/parserInternals.h>

#include <new>

namespace
{

struct ContextDeleter
{
    void operator()(xmlParserCtxt* context) const
    {
        xmlFreeDoc(context->myDoc);
        xmlFreeParserCtxt(context);
    }
};

void FreeChildren(xmlNode* element)
{
    xmlFreeNodeList(element->children);
    element->children = nullptr;
    element->last = nullptr;
}

/** Receives the elements of a file from the parser. */
class Receiver
{
public:
    explicit Receiver(KeyTree& tree) : m_builder(tree, KeyTreeBuilder::Texts::InTree) {}

    /** Has the parser of @p context report to this object. */
    void Attach(xmlParserCtxt* context)
    {
        context->_private = this;
        context->sax->startElementNs = StartElement;
        context->sax->endElementNs = EndElement;
    }

    /** Throws if there was no memory for an element. */
    void RequireMemory() const
    {
        if (m_isOutOfMemory)
        {
            throw std::bad_alloc();
        }
    }

private:
    /** An element that has not ended. */
    struct Open
    {
        xmlNode* node;
        KeyElement* record;
        KeyElement* lastChild;
    };

    static Receiver& Of(xmlParserCtxt* context)
    {
        return *static_cast<Receiver*>(context->_private);
    }

    static void StartElement(void* parser, const xmlChar* name, const xmlChar* prefix,
                             const xmlChar* space, int spaceCount, const xmlChar** spaces,
                             int attributeCount, int defaultedCount, const xmlChar** attributes)
    {
        const auto context = static_cast<xmlParserCtxt*>(parser);
        Receiver& receiver = Of(context);
        if (receiver.IsInnermost(context->node))
        {
            FreeChildren(context->node); // an element beside them: no value
        }
        xmlSAX2StartElementNs(parser, name, prefix, space, spaceCount, spaces, attributeCount,
                              defaultedCount, attributes);
        receiver.Guard(context, [&] { receiver.Start(context->node); });
    }

    static void EndElement(void* parser, const xmlChar* name, const xmlChar* prefix,
                           const xmlChar* space)
    {
        const auto context = static_cast<xmlParserCtxt*>(parser);
        Receiver& receiver = Of(context);
        xmlNode* const element = context->node;
        xmlSAX2EndElementNs(parser, name, prefix, space);
        if (receiver.IsInnermost(element))
        {
            receiver.Guard(context, [&] { receiver.End(); });
        }
    }

    /** No exception passes through the engine. */
    template <class Step>
    void Guard(xmlParserCtxt* context, const Step& step)
    {
        try
        {
            step();
        }
        catch (const std::bad_alloc&)
        {
            m_isOutOfMemory = true;
            xmlStopParser(context);
        }
    }

    bool IsInnermost(const xmlNode* element) const
    {
        return !m_open.empty() && m_open.back().node == element;
    }

    /** Elements of an entity are no children of an element that is open: they are left alone. */
    bool IsChild(const xmlNode* element) const
    {
        return m_open.empty() ? element->parent == reinterpret_cast<const xmlNode*>(element->doc)
                              : element->parent == m_open.back().node;
    }

    void Start(xmlNode* element)
    {
        if (element == nullptr || !IsChild(element))
        {
            return;
        }
        Open none = {};
        Open& parent = m_open.empty() ? none : m_open.back();
        parent.lastChild = m_builder.Add(element, parent.record, parent.lastChild);
        m_open.push_back({element, parent.lastChild, nullptr});
    }

    void End()
    {
        const Open ended = m_open.back();
        m_open.pop_back();
        if (ended.lastChild == nullptr)
        {
            m_builder.SetValue(*ended.record, ended.node);
        }
        if (!m_open.empty()) // the engine's document keeps its root
        {
            xmlUnlinkNode(ended.node);
            xmlFreeNode(ended.node);
        }
    }

    KeyTreeBuilder m_builder;
    std::vector<Open> m_open;
    bool m_isOutOfMemory = false;
};

/** @return whether the file is well-formed. */
bool Parse(const std::string& path, KeyTree& tree)
{
    const std::unique_ptr<xmlParserCtxt, ContextDeleter> context(
        xmlCreateFileParserCtxt(path.c_str()));
    if (context == nullptr)
    {
        return false;
    }
    xmlCtxtUseOptions(context.get(), XML_PARSE_COMPACT);
    Receiver receiver(tree);
    receiver.Attach(context.get());
    xmlParseDocument(context.get());
    receiver.RequireMemory();
    return context->wellFormed != 0 && tree.Root() != nullptr;
}

} // namespace

KeyTree LoadKeyTree(const std::string& path, std::istream* standardInput)
{
    if (g_LumLogParams.xmlConfigParserMask != 0)
    {
        LoadedReader reader = LoadFile(path, standardInput);
        KeyTree tree(DocumentOf(*reader));
        tree.m_reader = std::move(reader);
        return tree;
    }
    KeyTree tree;
    LoadWith([&](const std::string& file) { return Parse(file, tree); }, path, standardInput);
    return tree;
}

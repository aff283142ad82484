#include "file/LoadsAgain.h"

#include "file/Engine.h"
#include "output/Failure.h"

#include <libxml/parser.h>
#include <libxml/parserInternals.h>

#include <climits>
#include <memory>
#include <new>

namespace
{

/** What only the tree limits from 2.14 on; before, the parser does. */
const int kMostLevels = LIBXML_VERSION < 21400 ? INT_MAX : 256;

/** The parse of a document whose elements and texts are dropped. */
class TreelessParse
{
public:
    TreelessParse() : m_context(xmlNewParserCtxt())
    {
        if (m_context == nullptr)
        {
            throw std::bad_alloc();
        }
        m_context->_private = this;
        DropContent(*m_context->sax);
    }

    ~TreelessParse() { xmlFreeParserCtxt(m_context); }
    TreelessParse(const TreelessParse&) = delete;
    TreelessParse& operator=(const TreelessParse&) = delete;

    /** @return whether a load of @p bytes succeeds. */
    bool Succeeds(const std::string& bytes)
    {
        xmlDoc* const document = xmlCtxtReadMemory(
            m_context, bytes.data(), static_cast<int>(bytes.size()), nullptr, nullptr, 0);
        xmlFreeDoc(document);
        return document != nullptr && !m_hasHugeText && !m_isTooDeep;
    }

    bool HasHugeText() const { return m_hasHugeText; }
    bool IsTooDeep() const { return m_isTooDeep; }

private:
    /** Declarations are kept, for what refers to them. */
    static void DropContent(xmlSAXHandler& handler)
    {
        handler.startElement = nullptr;
        handler.endElement = nullptr;
        handler.startElementNs = StartElement;
        handler.endElementNs = EndElement;
        handler.characters = Characters;
        handler.ignorableWhitespace = Characters;
        handler.cdataBlock = [](void* context, const xmlChar*, int) { EndText(context); };
        handler.comment = [](void* context, const xmlChar*) { EndText(context); };
        handler.processingInstruction = [](void* context, const xmlChar*, const xmlChar*)
        { EndText(context); };
        handler.reference = [](void* context, const xmlChar*) { EndText(context); };
    }

    static void StartElement(void* context, const xmlChar*, const xmlChar*, const xmlChar*, int,
                             const xmlChar**, int, int, const xmlChar**)
    {
        EndText(context);
        TreelessParse& parse = Of(context);
        parse.m_isTooDeep = ++parse.m_levels > kMostLevels || parse.m_isTooDeep;
    }

    static void EndElement(void* context, const xmlChar*, const xmlChar*, const xmlChar*)
    {
        EndText(context);
        --Of(context).m_levels;
    }

    static void EndText(void* context) { Of(context).m_textLength = 0; }

    /** Only the tree has this limit of the engine. */
    static void Characters(void* context, const xmlChar*, int size)
    {
        TreelessParse& parse = Of(context);
        parse.m_textLength += static_cast<size_t>(size);
        parse.m_hasHugeText = parse.m_hasHugeText || parse.m_textLength > XML_MAX_TEXT_LENGTH;
    }

    static TreelessParse& Of(void* context)
    {
        return *static_cast<TreelessParse*>(static_cast<xmlParserCtxt*>(context)->_private);
    }

    xmlParserCtxt* const m_context;
    size_t m_textLength = 0; ///< since another node
    bool m_hasHugeText = false;
    int m_levels = 0;
    bool m_isTooDeep = false;
};

std::string WhyNotLoaded(const TreelessParse& parse, const FirstEngineError& error)
{
    return parse.HasHugeText() ? ": a text of more than 10,000,000 bytes"
           : parse.IsTooDeep()
               ? ": more than " + std::to_string(kMostLevels) + " levels of elements"
               : ", line " + error.Text();
}

/** Some lacks of memory look like an error of the file, which the same bytes then have no more. */
void RequireFailsAgain(const std::string& bytes)
{
    if (bytes.size() <= INT_MAX && TreelessParse().Succeeds(bytes))
    {
        throw std::bad_alloc();
    }
}

} // namespace

void RequireLoadsAgain(const std::string& bytes, const std::string& target)
{
    const FirstEngineError error;
    TreelessParse parse;
    if (bytes.size() > INT_MAX || !parse.Succeeds(bytes))
    {
        error.RequireMemory();
        RequireFailsAgain(bytes);
        throw Failure(ExitStatus::NotSaved, "not saved: " + target + " would no longer load" +
                                                WhyNotLoaded(parse, error));
    }
}

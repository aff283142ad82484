// XPath of libxml2: with an expression that is compiled and a context that is made for each
// evaluation, and with both kept.

#include "Documents.h"
#include "Operations.h"
#include "library/Loaded.h"

#include <libxml/parser.h>
#include <libxml/xpath.h>

#include <memory>

namespace bench
{

namespace
{

using Context = std::unique_ptr<xmlXPathContext, decltype(&xmlXPathFreeContext)>;
using Object = std::unique_ptr<xmlXPathObject, decltype(&xmlXPathFreeObject)>;
using Expression = std::unique_ptr<xmlXPathCompExpr, decltype(&xmlXPathFreeCompExpr)>;

const xmlChar* EngineText(const std::string& text)
{
    return reinterpret_cast<const xmlChar*>(text.c_str());
}

/** The texts of the selected elements, separated by newlines. */
std::string Texts(const xmlXPathObject& selection)
{
    std::string result;
    const xmlNodeSet* const nodes = selection.nodesetval;
    for (int i = 0; nodes != nullptr && i != nodes->nodeNr; ++i)
    {
        result += i == 0 ? "" : "\n";
        result += reinterpret_cast<const char*>(nodes->nodeTab[i]->children->content);
    }
    return result;
}

std::string EvaluatedFresh(xmlDoc* document, const std::string& expression)
{
    const Context context(xmlXPathNewContext(document), xmlXPathFreeContext);
    const Object selection(xmlXPathEvalExpression(EngineText(expression), context.get()),
                           xmlXPathFreeObject);
    return Texts(*selection);
}

/** An expression and a context that are kept for many evaluations. */
class Compiled
{
public:
    Compiled(xmlDoc* document, const std::string& expression)
        : m_context(xmlXPathNewContext(document), xmlXPathFreeContext),
          m_expression(xmlXPathCompile(EngineText(expression)), xmlXPathFreeCompExpr)
    {
    }

    std::string Evaluated() const
    {
        const Object selection(xmlXPathCompiledEval(m_expression.get(), m_context.get()),
                               xmlXPathFreeObject);
        return Texts(*selection);
    }

private:
    const Context m_context;
    const Expression m_expression;
};

void AddLookUp(const std::string& workload, const std::string& file, const std::string& expression,
               const std::string& expected)
{
    Add(workload, kXPathFresh, expected,
        [file, expression]
        {
            return [document = LoadedDocument(file), expression]
            { return EvaluatedFresh(document, expression); };
        });
    Add(workload, kXPathCompiled, expected,
        [file, expression]
        {
            return [compiled = std::make_shared<Compiled>(LoadedDocument(file), expression)]
            { return compiled->Evaluated(); };
        });
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        Add(read.workload, kXPathFresh, read.value,
            [read]
            {
                return [read]
                {
                    xmlDoc* const document = xmlParseFile(read.path.c_str());
                    std::string value = EvaluatedFresh(document, read.xpath);
                    xmlFreeDoc(document);
                    return value;
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : kSiblingCounts)
    {
        AddLookUp(Sized(kLookUpPlain, count), Siblings(count), "/cfg/service", kServiceValue);
    }
    for (const std::size_t count : kItemCounts)
    {
        AddLookUp(Sized(kLookUpCondition, count), Items(count),
                  "/cfg/item[@id='" + std::to_string(count) + "']/name", ItemName(count));
    }
    for (const std::size_t count : kTextCounts)
    {
        AddLookUp(Sized(kLookUpTexts, count), bench::Texts(count), "/cfg/item", AllTexts(count));
    }
    for (const std::size_t levels : kDepths)
    {
        std::string expression = "/cfg";
        for (const std::string& name : NestedNames(levels))
        {
            expression += '/' + name;
        }
        AddLookUp(Sized(kLookUpDepth, levels), Nested(levels), expression, kNestedValue);
    }
}

const Registration registration(
    []
    {
        AddLoads();
        AddLookUps();
    });

} // namespace

} // namespace bench

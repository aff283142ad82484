#include "commands/Evaluation.h"

#include "file/Engine.h"
#include "output/Failure.h"
#include "output/Quoting.h"

#include "CXmlParser.h"

#include <libxml/xmlerror.h>

namespace
{

/** The library evaluates without prefixes, though the locations that find prints have them. */
std::string AdviceOnPrefixes(const FirstEngineError& error)
{
    return error.Code() == XML_XPATH_UNDEF_PREFIX_ERROR
               ? "; no prefixes are registered: write *[name()='p:a'] for p:a"
               : "";
}

} // namespace

XPathResult Evaluate(CXmlParser& document, const std::string& expression)
{
    const CXmlNode top = document.FindNode("/", CXmlNode());
    const FirstEngineError error;
    // Not FindAllNodes(), which ends at 255 nodes.
    XPathResult result(document.GetNodeSet(expression, top));
    error.RequireMemory();
    if (result == nullptr)
    {
        const std::string reason = error.IsNone() ? "" : ": " + error.Text();
        throw Failure(ExitStatus::BadUsage, "malformed expression " + Quoted(expression) + reason +
                                                AdviceOnPrefixes(error));
    }
    return result;
}

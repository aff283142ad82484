#ifndef KX_TOOLS_EVALUATION_H
#define KX_TOOLS_EVALUATION_H

#include <libxml/xpath.h>

#include <memory>
#include <string>

class CXmlParser;

struct FreeXPathResult
{
    void operator()(xmlXPathObject* result) const { xmlXPathFreeObject(result); }
};
using XPathResult = std::unique_ptr<xmlXPathObject, FreeXPathResult>;

/**
 * @return what @p expression evaluates to at the top of @p document.
 * @throws Failure if it is malformed.
 */
XPathResult Evaluate(CXmlParser& document, const std::string& expression);

#endif

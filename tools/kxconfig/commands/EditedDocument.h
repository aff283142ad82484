#ifndef KX_TOOLS_EDITEDDOCUMENT_H
#define KX_TOOLS_EDITEDDOCUMENT_H

#include "CXmlParser.h"

#include <libxml/tree.h>

#include <string>
#include <vector>

/** A document whose nodes are changed by XPath, through the library's document toolkit. */
class EditedDocument
{
public:
    /** @throws Failure if @p file cannot be loaded. */
    explicit EditedDocument(const std::string& file);

    /**
     * @return the nodes that @p expression selects, in document order: one, or more if @p all.
     * @throws Failure if there is none, or more than one without @p all, or if the expression is
     *         malformed or does not select nodes.
     */
    std::vector<xmlNode*> Select(const std::string& expression, bool all);

    xmlDoc* Get();
    CXmlParser& Parser() { return m_parser; }

private:
    const std::string m_file;
    CXmlParser m_parser;
};

/** @return "text", "comment" and so on, for messages. */
std::string KindName(const xmlNode* node);

/** Requires that @p name is the name of an element or attribute, without a prefix. */
void RequireName(const std::string& name);

#endif

#ifndef KX_CXMLATTR_H
#define KX_CXMLATTR_H

/**
 * @file CXmlAttr.h
 * An attribute's name and value, as CXmlNode::GetAttributeItems() lists them.
 */

#include <string>

#pragma GCC visibility push(default)

/**
 * A plain pair of strings, read and written directly.
 *
 * It is a copy of what the document held when it was made: changing it changes no document. Copying
 * and assignment work member by member and log nothing.
 *
 * @code
 * std::list<CXmlAttr> items = node.GetAttributeItems();
 * for (std::list<CXmlAttr>::iterator item = items.begin(); item != items.end(); ++item)
 * {
 *     std::cout << item->m_strName << "=" << item->m_strValue << "\n";
 * }
 * @endcode
 */
class CXmlAttr
{
public:
    /** Makes a pair of empty strings. Logs "+" and "-" (level 11, tag "CXmlAttr"). */
    CXmlAttr();

    /** Makes a pair of @p name and @p value. Logs "+" and "-" (level 11, tag "CXmlAttr"). */
    CXmlAttr(std::string name, std::string value);

    /** Logs "+" and "-" (level 11, tag "~CXmlAttr"), then releases both strings. */
    ~CXmlAttr();

    std::string m_strName;  ///< the attribute's name, without a namespace prefix
    std::string m_strValue; ///< the attribute's value
};

#pragma GCC visibility pop

#endif

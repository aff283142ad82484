#ifndef KX_CXMLATTR_H
#define KX_CXMLATTR_H

/// @file CXmlAttr.h
/// The name and value of an attribute, as CXmlNode::GetAttributeItems() lists them.

#include <string>

#pragma GCC visibility push(default)

/// A pair of strings, copied from the document: changing it does not change the document.
class CXmlAttr
{
public:
    /// Creates a pair of empty strings.
    CXmlAttr();

    /// Creates a pair of name and value.
    CXmlAttr(std::string name, std::string value);

    /// Releases the strings.
    ~CXmlAttr();

    std::string m_strName;  ///< the attribute's name, without a namespace prefix
    std::string m_strValue; ///< the attribute's value
};

#pragma GCC visibility pop

#endif

#include "CXmlAttr.h"

#include "diag/Log.h"

CXmlAttr::CXmlAttr()
{
    KX_TRACE_BOTH();
}

CXmlAttr::CXmlAttr(std::string name, std::string value) : m_strName(name), m_strValue(value)
{
    KX_TRACE_BOTH();
}

CXmlAttr::~CXmlAttr()
{
    KX_TRACE_BOTH();
}

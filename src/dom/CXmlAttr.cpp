#include "CXmlAttr.h"

#include "diag/Log.h"

CXmlAttr::CXmlAttr()
{
    KX_ENTER_AND_LEAVE();
}

CXmlAttr::CXmlAttr(std::string name, std::string value) : m_strName(name), m_strValue(value)
{
    KX_ENTER_AND_LEAVE();
}

CXmlAttr::~CXmlAttr()
{
    KX_ENTER_AND_LEAVE();
}

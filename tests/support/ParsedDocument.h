#ifndef KX_TESTS_SUPPORT_PARSEDDOCUMENT_H
#define KX_TESTS_SUPPORT_PARSEDDOCUMENT_H

#include "support/Engine.h"

#include <gtest/gtest.h>

#include <libxml/tree.h>

#include <string>

namespace kxtest
{

/** A fixture with one document of the engine. */
class ParsedDocument : public testing::Test
{
protected:
    ~ParsedDocument() override { xmlFreeDoc(m_document); }

    /** Replaces the document. */
    void Load(const std::string& xml)
    {
        xmlFreeDoc(m_document);
        m_document = ParseText(xml);
        ASSERT_NE(nullptr, m_document) << xml;
    }

    xmlDocPtr m_document = nullptr;
};

} // namespace kxtest

#endif

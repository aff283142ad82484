#ifndef KX_TESTS_CONFIG_MESSAGES_H
#define KX_TESTS_CONFIG_MESSAGES_H

// Records that several suites of the key-path store expect.

/** Of a reader or a writer that has no document. */
const char* const kNoMemberDocument = "Document structure pointer m_pXmlDoc is NULL";

/** Of a call that is given no document. */
const char* const kNoDocument = "Pointer to document structure is NULL";

#endif

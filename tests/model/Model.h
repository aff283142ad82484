#ifndef KX_TESTS_MODEL_MODEL_H
#define KX_TESTS_MODEL_MODEL_H

// The key-path store a second time: as slow and as literal as its rules read, every string copied
// at every step, every level a recursion. It shares nothing with the library but the engine.

#include "support/Log.h"

#include <libxml/tree.h>

#include <string>

namespace kxmodel
{

/** What reader and writer of one document must answer, log and change. */
class Model
{
public:
    /** @p document may be null; it stays the caller's. */
    explicit Model(xmlDocPtr document) : m_document(document) {}

    std::string GetValue(std::string key);
    int GetValue(std::string key, std::string& value);
    std::string XMLGetValue(xmlNodePtr node, std::string key);
    int XMLGetValue(xmlNodePtr node, std::string key, std::string& value, unsigned& found);

    int SetValue(std::string key, std::string value);
    int XMLSetValue(xmlNodePtr node, std::string key, std::string value, unsigned& updated);

    /** @return what was logged since the last call, under a mask with every bit set. */
    kxtest::Records TakeRecords();

private:
    void Log(int level, const std::string& tag, const std::string& text);

    xmlDocPtr m_document;
    kxtest::Records m_records;
};

} // namespace kxmodel

#endif

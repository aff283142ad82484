#ifndef KX_TESTS_MODEL_CASE_H
#define KX_TESTS_MODEL_CASE_H

// What library and model are compared on: a document and calls that are made on it one after the
// other. A case can be written as text, so that a failing one can be kept, read and replayed.

#include <string>
#include <vector>

namespace kxmodel
{

enum class Call
{
    Get,        ///< GetValue(key)
    GetInto,    ///< GetValue(key, value)
    GetInPlace, ///< GetValue(key, key): one string for both
    Collect,    ///< XMLGetValue(node, key)
    Append,     ///< XMLGetValue(node, key, value, found)
    Set,        ///< SetValue(key, value)
    Update      ///< XMLSetValue(node, key, value, updated)
};

struct Operation
{
    Call call = Call::Get;
    unsigned mask = 0; ///< log mask word during the call
    unsigned node = 0; ///< which node of the document the call starts from; 0: none
    std::string key;
    std::string value;
};

struct Case
{
    std::string document;
    std::vector<Operation> operations;
};

/**
 * A line for each operation (call, mask, node, key and value, separated by tabs, other bytes
 * escaped), an empty line and the document.
 */
std::string ToText(const Case& subject);

/** Reads any text at all: what is malformed means something, too. At most 64 operations. */
Case FromText(const std::string& text);

} // namespace kxmodel

#endif

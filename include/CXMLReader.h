#ifndef KX_CXMLREADER_H
#define KX_CXMLREADER_H

/// @file CXMLReader.h
/// Reads configuration values by key path.
///
/// A key path names the root element, then one element for each level below it:
///
///     key path  = root-name "." segment { "." segment }
///     segment   = element-name [ "@" condition ]
///     condition = term { ( "|" | "&" ) term }
///     term      = attribute-name "=" value
///
/// - `cfg.net@id=2.ip` finds the text of each ip in those net of the root cfg whose id is 2.
/// - Separators are single bytes. Nothing is escaped, quoted or trimmed. Names and values are
///   compared as whole byte strings, regardless of namespaces.
/// - A term is split at its first "=". It holds if the element has the attribute and their values
///   are equal; a term without "=" never holds.
/// - Terms are evaluated from left to right, without precedence. A term extends to the next "|", if
///   there is one: the first term of `a=1&b=2|c=3` holds if a is "1&b=2".
/// - An element has a value only if its one and only child is a text node.
/// - Every matching element of a level is visited, in document order, so that a key can find
///   several values. An element in the middle of a path contributes its own value as well.
/// - An element of another name suspends the condition for the next element of the right name.
///
/// docs/handbook/key-paths.md explains these rules with examples. The log records of each operation
/// are listed in docs/handbook/status-codes-and-messages.md.

#include <string>

struct _xmlDoc;
struct _xmlNode;

#pragma GCC visibility push(default)

#include "IConfigReader.h"

/// Holds one XML configuration document and looks up values in it.
///
/// A reader is used by one thread at a time; different readers are independent. It cannot be
/// copied. Operations throw only what strings throw: std::bad_alloc and std::length_error.
///
///     CXMLReader* reader = GetCXMLReaderObject("/etc/device.xml");
///     std::string address;
///     if (reader != 0 && reader->GetValue("cfg.net@id=2.ip", address) == 0)
///     {
///         // address holds the value, or several separated by "\n"
///     }
///     delete reader;
class CXMLReader : public IConfigReader
{
public:
    /// Creates a reader without a document.
    CXMLReader();

    /// Creates a reader and parses the file at path, which the engine interprets: see
    /// docs/handbook/limits.md. If the file is missing, unreadable or not well-formed, the reader
    /// holds no document and the engine prints its diagnosis to standard error.
    explicit CXMLReader(const std::string& path);

    /// Frees the document, if one is held.
    virtual ~CXMLReader();

    /// Parses the file at path. Returns 0, or 22 if the file is missing, unreadable or not
    /// well-formed; the reader then holds no document.
    ///
    /// In both cases a document that was held before is NOT freed. Parse once per reader, or keep
    /// the earlier GetDataPtr() and free it with xmlFreeDoc().
    virtual int ParseFile(const std::string& path);

    /// Returns the values that key finds, or "". It does not distinguish no document, an empty key,
    /// a key without ".", another root name and no match.
    ///
    /// Values under one parent on the last level run together, values from different branches are
    /// separated by "\n": for cfg.net.ip, the ip texts 1 and 2 in one net give "12", in two nets
    /// "1\n2". The own value of an element in the middle of the path is appended to the result of
    /// its level without a separator.
    virtual std::string GetValue(const std::string& key);

    /// Appends the values that key finds to value, each preceded by "\n" unless value is empty at
    /// that moment. Does not clear value, and leaves it unchanged if nothing is found. key may be
    /// the same string as value. Returns
    /// - 0 if a value was found,
    /// - 0, without a search, if key starts with another name than the root's,
    /// - 7 if key has no ".",
    /// - 22 if there is no document or no root element, or key is empty,
    /// - -2 if nothing was found.
    virtual int GetValue(const std::string& key, std::string& value);

    /// Returns the document (an xmlDocPtr), or null if none is held.
    ///
    /// The reader keeps ownership. The pointer is valid until the reader is destroyed. A later
    /// ParseFile() passes ownership of the document to the caller. CXMLWriter::SetDataPtr() can
    /// adopt the document.
    virtual void* GetDataPtr();

    /// The recursion of the one-argument GetValue(): looks up key, the rest of a key path, among
    /// the children of node. Returns "" for a null node or an empty key.
    std::string XMLGetValue(_xmlNode* node, const std::string& key);

    /// The recursion of the two-argument GetValue(): appends to value as that does, and sets found
    /// to 1 if a value was appended; otherwise both are unchanged. Test found, not the result: that
    /// is 22 for a null node or an empty key, otherwise -2 or the result of the last descent, 22 or
    /// -2, also when values were found.
    int XMLGetValue(_xmlNode* node, const std::string& key, std::string& value,
                    unsigned int& found);

private:
    CXMLReader(const CXMLReader&);
    CXMLReader& operator=(const CXMLReader&);

    _xmlDoc* m_pXmlDoc;
};

/// Creates a reader and parses the file at path. The caller deletes the reader.
///
/// Returns null if path is null or the reader cannot be allocated. If the file cannot be parsed,
/// returns a reader without a document, whose GetDataPtr() returns null and GetValue() 22.
extern "C" CXMLReader* GetCXMLReaderObject(const char* path);

#pragma GCC visibility pop

#endif

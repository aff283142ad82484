#ifndef KX_CXMLREADER_H
#define KX_CXMLREADER_H

/**
 * @file CXMLReader.h
 * Reading configuration values by key path.
 *
 * @par Key paths
 * A key path names an element level by level: the root element's name, then one element name for
 * each level below it, joined by ".".
 *
 * @verbatim
   key path   = root-name "." segment { "." segment }
   segment    = element-name [ "@" condition ]
   condition  = term { ( "|" | "&" ) term }
   term       = attribute-name "=" value
   @endverbatim
 *
 * - Separators are single bytes. Nothing can be escaped or quoted and nothing is trimmed: a name
 *   that contains "." or a condition value that contains "." cannot be expressed.
 * - Names and values are compared as whole byte strings. Namespaces are not looked at.
 * - A segment's condition starts after its first "@" and narrows the elements of that name to
 *   those whose attributes fulfil it: cfg.net\@id=2.ip
 * - A term is split at its first "="; its value is all that follows and may be empty. A term
 *   without "=" never holds.
 * - Terms combine strictly from left to right; neither "|" nor "&" binds tighter. As long as a "|"
 *   lies ahead, a term reaches up to it: in a=1&b=2|c=3 the first term asks whether the attribute
 *   a has the value "1&b=2".
 * - An attribute's own value cannot be read: "@" only filters.
 *
 * @par What has a value
 * An element has a value only if a text node is its one and only child. An element that is empty,
 * or that holds child elements (indentation around them included), a comment beside its text or a
 * CDATA section has none and contributes nothing.
 *
 * @par Which elements are found
 * On each level all elements of the segment's name are visited in document order, so that one key
 * path can yield several values. Two results are deliberate and clients rely on them:
 * - Once an element of another name has been met on a level, the segment's condition is suspended:
 *   the next element that matches by name is taken whatever its attributes. From then on the
 *   condition is in force again, until the next element of another name.
 * - An element at the level of a segment in the middle of the path also contributes its own value,
 *   if it has one.
 *
 * @par Status codes
 * | code | meaning                                                          |
 * | ---- | ---------------------------------------------------------------- |
 * | 0    | success; also for a key path that starts with a foreign name     |
 * | 7    | the key path has no "."                                          |
 * | 22   | no document, no root element, an empty key, a file not parsed    |
 * | -2   | no value found                                                   |
 *
 * @par Logging
 * Records pass through the platform's KxLog() under the operation's bare name and only if bit
 * (1 << level) of the library's mask word in g_LumLogParams is set: 9 errors, 11 trace ("+" on
 * entry and "-" on return unless said otherwise), 29 keys and values.
 */

#include <string>

struct _xmlDoc;
struct _xmlNode;

#pragma GCC visibility push(default)

#include "IConfigReader.h"

/**
 * Holds one XML configuration document and answers key paths on it.
 *
 * A reader is used by one thread at a time; readers are independent of each other. It cannot be
 * copied. It throws nothing of its own; only what string handling throws when memory or lengths are
 * exhausted (std::bad_alloc, std::length_error) leaves an operation.
 *
 * @code
 * CXMLReader* reader = GetCXMLReaderObject("/etc/device.xml");
 * std::string address;
 * if (reader != 0 && reader->GetValue("cfg.net@id=2.ip", address) == 0)
 * {
 *     // address holds the value, or several separated by "\n"
 * }
 * delete reader;
 * @endcode
 */
class CXMLReader : public IConfigReader
{
public:
    /** Makes a reader without a document. Logs nothing. */
    CXMLReader();

    /**
     * Makes a reader of the file at @p path.
     *
     * The reader is complete in any case: if the file is missing, unreadable or not well-formed, it
     * holds no document, which GetDataPtr() tells, and the engine prints its own diagnosis to
     * standard error. The path is the engine's to interpret: it reads gzip transparently, takes "-"
     * for standard input and fetches URLs if it was built to.
     *
     * @param path  a file's path.
     *
     * Logs "File Path %s" with the path (level 11) in place of "+" and no "-"; on failure also
     * "Pointer to document structure is NULL" (level 9).
     */
    explicit CXMLReader(const std::string& path);

    /**
     * Frees the document, if one is held.
     *
     * Logs "Destructor" (level 11) in place of "+" and "-".
     */
    virtual ~CXMLReader();

    /**
     * Parses the file at @p path and holds its document from now on.
     *
     * A document that was held before is not freed; it stays allocated and the reader forgets it,
     * whether or not the new file parses. Clients parse once per reader, or keep the earlier
     * pointer from GetDataPtr() and free it with xmlFreeDoc() themselves.
     *
     * @param path  a file's path, as for the constructor.
     * @return 0, or 22 if the file is missing, unreadable or not well-formed: then no document is
     *         held and "Pointer to document structure is NULL" (level 9) is logged.
     */
    virtual int ParseFile(const std::string& path);

    /**
     * Looks up @p key and returns what it finds.
     *
     * Values found under one parent on the last level run together without a separator; values
     * found through different branches are separated by "\n"; the own value of an element in the
     * middle of the path joins what its level has found so far without one. For cfg.net.ip, two ip
     * elements with the texts 1 and 2 in a single net yield "12", in two nets "1\n2". The
     * two-argument form separates every value.
     *
     * @param key  the key path.
     * @return the value or values, or an empty string: no document, an empty or malformed key, a
     *         foreign root name and no match look the same.
     *
     * Logs "Key %s" with the key (level 11) in place of "+" and no "-". Without a document or with
     * an empty key "Document structure pointer m_pXmlDoc is NULL" (level 9) follows, otherwise
     * "Parsed Value :: %s" with the result (level 29).
     */
    virtual std::string GetValue(const std::string& key);

    /**
     * Looks up @p key and appends what it finds to @p value.
     *
     * @param key    the key path.
     * @param value  not cleared: each value found is appended, preceded by "\n" unless the string
     * is empty at that moment. Unchanged if nothing is found. May be the same string as @p key.
     * @return
     * - 0 if a value was found,
     * - 0 also, with nothing searched, if the text before the first "." is not the root's name;
     *   clients that must know compare the root's name themselves,
     * - 7 if the key has no ".",
     * - 22 without a document or with an empty key ("Document structure pointer m_pXmlDoc is NULL",
     *   level 9), or if the document has no root element ("Root Node ptr is NULL", level 9),
     * - -2 if nothing was found.
     *
     * Unless the document is missing or the key empty, logs "Key is %s" with the key and at last
     * "Parsed Value :: %s" with the value string as it then stands (both level 29).
     */
    virtual int GetValue(const std::string& key, std::string& value);

    /**
     * @return the document held (an xmlDocPtr), or null.
     *
     * The reader keeps the ownership: the pointer stays valid until the reader is destroyed, or
     * until ParseFile() forgets the document, from when on it is the caller's. A writer may work on
     * the document in place; the caller then keeps the reader alive and detaches the writer before
     * either is destroyed, since both free what they hold. Logs nothing.
     */
    virtual void* GetDataPtr();

    /**
     * Looks up @p key, the rest of a key path, below @p node; the worker of the one-argument
     * GetValue().
     *
     * @param node  the element or document node whose children the key's first segment names; may
     * be null.
     * @param key   the rest of a key path.
     * @return the value or values as GetValue() returns them; empty for a null node or an empty
     * key. Logs nothing.
     */
    std::string XMLGetValue(_xmlNode* node, const std::string& key);

    /**
     * Looks up @p key, the rest of a key path, below @p node and appends what it finds to @p value;
     * the worker of the two-argument GetValue().
     *
     * @param node   the element or document node whose children the key's first segment names; may
     *               be null.
     * @param key    the rest of a key path.
     * @param value  as in GetValue().
     * @param found  set to 1 if a value was appended, otherwise unchanged; this is what tells.
     * @return 22 for a null node or an empty key; otherwise -2, or what the last descent into a
     *         lower level returned: 22 or -2 also when values were found.
     *
     * Logs "+" and "-" (level 11) and between them, unless it returns 22 at once, "Key :: %s" with
     * the key (level 29), followed by the same sequence for each element that it descends into.
     */
    int XMLGetValue(_xmlNode* node, const std::string& key, std::string& value,
                    unsigned int& found);

private:
    CXMLReader(const CXMLReader&);
    CXMLReader& operator=(const CXMLReader&);

    _xmlDoc* m_pXmlDoc;
};

/**
 * Makes a reader of the file at @p path.
 *
 * @param path  a file's path; zero-terminated.
 * @return the reader, which the caller destroys with delete, or null if @p path is null or the
 *         object cannot be allocated. A file that cannot be parsed yields a reader without a
 * document: GetDataPtr() answers null and GetValue() 22. Logs nothing itself.
 */
extern "C" CXMLReader* GetCXMLReaderObject(const char* path);

#pragma GCC visibility pop

#endif

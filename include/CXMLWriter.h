#ifndef KX_CXMLWRITER_H
#define KX_CXMLWRITER_H

/**
 * @file CXMLWriter.h
 * Changing configuration values by key path and saving the file.
 *
 * Key paths are written as for reading (CXMLReader.h tells the grammar), but the update walks the
 * document in an order of its own: see CXMLWriter::SetValue().
 *
 * @par Status codes
 * | code | meaning                                                                           |
 * | ---- | --------------------------------------------------------------------------------- |
 * | 0    | success; also for a key path that starts with a foreign name                      |
 * | 7    | an empty path; a key path without "."; SetValue() without document or key         |
 * | 22   | a file not parsed; no root element; a key that ends in "."                        |
 * | -2   | nothing updated; a file that was not written                                      |
 *
 * @par Logging
 * Records pass through the platform's KxLog() under the operation's bare name and only if bit
 * (1 << level) of the library's mask word in g_LumLogParams is set: 9 errors, 11 trace
 * ("+" on entry and "-" on return unless told otherwise), 29 keys.
 */

#include <string>

struct _xmlDoc;
struct _xmlNode;

#pragma GCC visibility push(default)

#include "IConfigWriter.h"

/**
 * Holds one XML configuration document and the path that it is saved to, and replaces element text
 * addressed by key path.
 *
 * | state             | entered by                                       | SetValue | SaveData |
 * | ----------------- | ------------------------------------------------ | -------- | -------- |
 * | no document       | default constructor, failed parse, SetDataPtr(0) | 7        | -2       |
 * | document, no path | SetDataPtr() on a writer without a path          | works    | -2       |
 * | document and path | a successful parse; SetDataPtr() and SetPath()   | works    | 0 or -2  |
 *
 * The writer owns the document that it holds at any moment: its destructor and ParseFile() free it.
 * Only SetDataPtr() drops a document without freeing it.
 *
 * A writer is used by one thread at a time; writers that hold different documents are independent
 * of each other. It cannot be copied. It throws nothing of its own; only what string handling
 * throws when memory or lengths are exhausted (std::bad_alloc, std::length_error) leaves an
 * operation.
 *
 * @code
 * CXMLWriter* writer = GetCXMLWriterObject("/etc/device.xml");
 * if (writer != 0 && writer->SetValue("cfg.name", "box") == 0 && writer->SaveData() == 0)
 * {
 *     // the file holds the new name
 * }
 * delete writer;
 * @endcode
 */
class CXMLWriter : public IConfigWriter
{
public:
    /** Makes a writer without document and path. Logs "+" (level 11) and no "-". */
    CXMLWriter();

    /**
     * Makes a writer of the file at @p path, which is also the path that it saves to.
     *
     * The writer is complete in any case: if the file is missing, unreadable or not well-formed, it
     * holds no document.
     *
     * @param path  a file's path, which the engine interprets when it parses and when it saves.
     *
     * Logs "File Path %s" with the path (level 11) in place of "+" and no "-"; on failure also
     * "Pointer to document structure is NULL" (level 9).
     */
    explicit CXMLWriter(const std::string& path);

    /**
     * Frees the document, if one is held. What was changed and not saved is lost.
     *
     * Logs "Destructor" (level 11) in place of "+" and "-".
     */
    virtual ~CXMLWriter();

    /**
     * Names @p path as the path to save to, frees the document held and parses the file.
     *
     * The path is set through the virtual SetPath(), so that a derived class's is honoured. The
     * earlier document is gone also when the new file does not parse.
     *
     * @param path  a file's path.
     * @return 0, or 22 if the file is missing, unreadable or not well-formed, or the path is empty:
     *         then no document is held and "Pointer to document structure is NULL" (level 9) is
     *         logged. An empty path leaves the path to save to as it was; another failed path does
     *         not.
     */
    virtual int ParseFile(const std::string& path);

    /**
     * Replaces the text of the elements that @p key addresses by @p value, in memory.
     *
     * Only an element whose one and only child is a text node is replaced; elements and attributes
     * are never created, and an empty element is not filled.
     *
     * @par The reach of an update
     * The update goes through the children of the root, comparing them with the first segment after
     * the root's name, and below every child, whether or not its name matched, it goes on with the
     * rest of the key. Several elements can be updated by one call. Clients rely on all of this:
     * - A key with a single segment after the root's name updates every element of that name that
     *   holds only text, at any depth.
     * - On each level only the first element child is compared with the segment itself; its later
     *   siblings are compared with the rest of the key, as one name up to its first "@" and a
     *   condition after it.
     * - An element that fails a condition is left out with all that is below it, and makes its next
     *   sibling be compared with the segment again; if the key has no further segment, with an
     * empty name instead, which no element has.
     * - An element in the middle of the path that holds only text is replaced as well.
     *
     * @par What becomes of the value
     * The engine takes it as XML text in which entity references are recognised:
     * | value                  | the element then holds                                |
     * | ---------------------- | ----------------------------------------------------- |
     * | a&lt;b                 | the text; the bracket is escaped when saved           |
     * | a&amp;amp;b            | the text a&amp;b; saved as a&amp;amp;b                |
     * | a&amp;b                | nothing, or what the engine's version makes of it     |
     * | a &amp; b;             | the same, or a file that saves, but does not load     |
     * | &amp;name; (undefined) | a reference; the file saves, but does not load again  |
     * | empty                  | nothing: a later SetValue() does not reach it         |
     *
     * Control characters other than tab, newline and carriage return save, but do not load again;
     * newer engines replace them when they save. A value is used up to its first NUL byte. If the
     * engine runs out of memory, an element can be left empty though it counts as updated: the
     * engine does not tell.
     *
     * @param key    the key path; its first component is the root's name, without a condition.
     * @param value  the new text.
     * @return
     * - 0 if at least one element was updated,
     * - 0 also, with nothing changed, if the text before the first "." is not the root's name,
     * - 7 without a document or with an empty key ("Document structure pointer m_pXmlDoc is NULL",
     *   level 9), or if the key has no ".",
     * - 22 if the document has no root element; also, though elements were updated, if the key ends
     *   in "." and the last level that was entered is the one after it,
     * - -2 if nothing was updated.
     *
     * Logs "Key %s" with the key (level 11) in place of "+" and no "-".
     */
    virtual int SetValue(const std::string& key, std::string value);

    /**
     * Writes the document to the path: encoded in UTF-8 and declared so whatever the encoding of
     * the file that was parsed, without reformatting. The document stays in memory, unchanged.
     *
     * The file is written in place: if the device is full, what was in the file is lost.
     *
     * @return 0, or -2 if the engine could not write the file, for want of a document or a path
     * too. Logs "+" (level 11) and no "-".
     */
    virtual int SaveData();

    /**
     * Names the file that SaveData() writes; neither parses nor touches the document.
     *
     * @param path  a file's path; the engine decodes escapes such as %20 in it when it saves.
     * @return 0, or 7 if @p path is empty: then the path stays as it was. Logs nothing.
     */
    virtual int SetPath(const std::string& path);

    /**
     * Adopts @p document (an xmlDocPtr, such as a reader's GetDataPtr()) in place of the one held,
     * which is dropped without being freed.
     *
     * From now on the writer owns it and frees it in its destructor or in ParseFile(). A document
     * that a reader holds too would be freed twice: the caller detaches the writer with
     * SetDataPtr(0) before either is destroyed, and keeps the reader alive until then.
     *
     * @code
     * writer->SetDataPtr(reader->GetDataPtr());
     * writer->SetPath("/etc/device.xml");
     * writer->SetValue("cfg.name", "box");
     * writer->SaveData();
     * writer->SetDataPtr(0); // the reader frees the document
     * @endcode
     *
     * @param document  may be null: the writer is then without a document, and "Data Pointer not
     * set in xml writer" (level 9) is logged, which is the only record.
     */
    virtual void SetDataPtr(void* document);

    /**
     * Replaces the text of the elements that @p key, the rest of a key path, addresses below
     * @p node; the worker of SetValue(), which tells the reach.
     *
     * @param node     the element or document node whose children the key's first segment names;
     * may be null.
     * @param key      the rest of a key path.
     * @param value    the new text; not changed.
     * @param updated  set to 1 by every update, otherwise unchanged; this is what tells.
     * @return 22 for an empty key or a null node; otherwise what the last descent from this level
     *         returned, or 0 if there was none.
     *
     * Logs "Key :: %s" with the key (level 29) for this level and for each that it descends into,
     * unless that returns 22 at once.
     */
    int XMLSetValue(_xmlNode* node, const std::string& key, std::string& value,
                    unsigned int& updated);

private:
    CXMLWriter(const CXMLWriter&);
    CXMLWriter& operator=(const CXMLWriter&);

    _xmlDoc* m_pXmlDoc;
    std::string m_strXmlFile; ///< the path to save to
};

/**
 * Makes a writer of the file at @p path.
 *
 * @param path  a file's path; zero-terminated.
 * @return the writer, which the caller destroys with delete, or null if @p path is null or the
 *         object cannot be allocated. A file that cannot be parsed yields a writer without a
 * document, whose SetValue() answers 7. Logs nothing itself.
 */
extern "C" CXMLWriter* GetCXMLWriterObject(const char* path);

/**
 * Makes a writer without document and path.
 *
 * @return the writer, which the caller destroys with delete, or null if the object cannot be
 *         allocated. Logs nothing itself.
 */
extern "C" CXMLWriter* GetCXMLWriterObjectNoParam();

#pragma GCC visibility pop

#endif

#ifndef KX_CXMLWRITER_H
#define KX_CXMLWRITER_H

/// @file CXMLWriter.h
/// Changes configuration values by key path and saves the file.
///
/// Key paths have the grammar of CXMLReader.h, but an update walks the document in its own order
/// and reaches further than a lookup: docs/handbook/updates.md describes the walk. The log records
/// of each operation are listed in docs/handbook/status-codes-and-messages.md.

#include <string>

struct _xmlDoc;
struct _xmlNode;

#pragma GCC visibility push(default)

#include "IConfigWriter.h"

/// Holds one XML configuration document and the path to save it to, and replaces text in it.
///
/// The writer owns the document that it holds. The destructor and ParseFile() free it; SetDataPtr()
/// drops it without freeing it.
///
/// A writer is used by one thread at a time; writers with different documents are independent. It
/// cannot be copied. Operations throw only what strings throw: std::bad_alloc, std::length_error.
///
///     CXMLWriter* writer = GetCXMLWriterObject("/etc/device.xml");
///     if (writer != 0 && writer->SetValue("cfg.name", "box") == 0 && writer->SaveData() == 0)
///     {
///         // the file holds the new name
///     }
///     delete writer;
class CXMLWriter : public IConfigWriter
{
public:
    /// Creates a writer without a document and without a path.
    CXMLWriter();

    /// Creates a writer that saves to path, and parses the file at path. If the file is missing,
    /// unreadable or not well-formed, the writer holds no document.
    explicit CXMLWriter(const std::string& path);

    /// Frees the document, if one is held. Changes that were not saved are lost.
    virtual ~CXMLWriter();

    /// Sets the path to save to with the virtual SetPath(), frees the document held and parses the
    /// file at path. Returns 0, or 22 if the file is missing, unreadable or not well-formed; the
    /// path is then set all the same and no document is held. An empty path also gives 22, but
    /// leaves the path to save to unchanged.
    virtual int ParseFile(const std::string& path);

    /// Replaces the text of the elements that key reaches by value, in memory.
    ///
    /// Changes only elements whose one and only child is a text node: never creates elements or
    /// attributes, and never fills an empty element. Can change several elements, among them some
    /// that a lookup with the same key does not find: see docs/handbook/updates.md.
    ///
    /// value is XML text up to its first NUL byte. Write an ampersand as an entity reference: a
    /// bare one drops text. With an undefined reference or a control character a file can be saved
    /// that does not load. After an empty value no later update reaches the element. Short of
    /// memory, an element can be left empty although it counts as changed. Returns
    /// - 0 if an element was changed,
    /// - 0, with nothing changed, if key starts with another name than the root's,
    /// - 7 if there is no document, or key is empty or has no ".",
    /// - 22 if the document has no root element,
    /// - 22 also if key ends in "." and the walk's last descent was past that ".", even if elements
    ///   were changed,
    /// - -2 if nothing was changed.
    virtual int SetValue(const std::string& key, std::string value);

    /// Writes the document to the path, in UTF-8 and declared so, without reformatting. Returns 0,
    /// or -2 if there is no document or no path, or the engine could not write the file.
    ///
    /// Writes in place: after a failed write the old content of the file can be lost. The document
    /// stays in memory, unchanged.
    virtual int SaveData();

    /// Sets the path that SaveData() writes to. Returns 0, or 7 if path is empty; the path is then
    /// unchanged. When it saves, the engine decodes escapes such as "%20" in the path: see
    /// docs/handbook/limits.md.
    virtual int SetPath(const std::string& path);

    /// Adopts document (an xmlDocPtr), or none if it is null. Does NOT free the document that was
    /// held before.
    ///
    /// The writer then owns document and frees it in the destructor or in ParseFile(). If a reader
    /// owns it too, detach the writer before either is destroyed:
    ///
    ///     writer->SetDataPtr(reader->GetDataPtr());
    ///     writer->SetPath("/etc/device.xml");
    ///     writer->SetValue("cfg.name", "box");
    ///     writer->SaveData();
    ///     writer->SetDataPtr(0); // the reader frees the document
    virtual void SetDataPtr(void* document);

    /// The recursion of SetValue(): replaces text by value below node, where key is the rest of a
    /// key path. Sets updated to 1 if an element was changed, otherwise leaves it unchanged; does
    /// not change value. Test updated, not the result: that is 22 for a null node or an empty key,
    /// otherwise the result of the last descent from this level, or 0 if there was none.
    int XMLSetValue(_xmlNode* node, const std::string& key, std::string& value,
                    unsigned int& updated);

private:
    CXMLWriter(const CXMLWriter&);
    CXMLWriter& operator=(const CXMLWriter&);

    _xmlDoc* m_pXmlDoc;
    std::string m_strXmlFile; ///< the path to save to
};

/// Creates a writer that saves to path, and parses the file at path. The caller deletes the writer.
///
/// Returns null if path is null or the writer cannot be allocated. If the file cannot be parsed,
/// returns a writer without a document, whose SetValue() returns 7.
extern "C" CXMLWriter* GetCXMLWriterObject(const char* path);

/// Creates a writer without a document and without a path. The caller deletes the writer. Returns
/// null if the writer cannot be allocated.
extern "C" CXMLWriter* GetCXMLWriterObjectNoParam();

#pragma GCC visibility pop

#endif

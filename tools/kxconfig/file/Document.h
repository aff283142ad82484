#ifndef KX_TOOLS_DOCUMENT_H
#define KX_TOOLS_DOCUMENT_H

#include "output/ExitStatus.h"

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include <memory>
#include <string>

/**
 * Makes the engine count lines, and keeps it from printing its complaints: LoadFile() tells the
 * first of them instead.
 */
void PrepareEngine();

/**
 * Loads a file of this machine; URLs and other names that the engine would fetch are not files.
 *
 * @param complaint  receives why there is no document: one line, with the line number if the file
 * is not well-formed.
 * @return a reader that holds a document, or null.
 */
std::unique_ptr<CXMLReader> LoadFile(const std::string& path, std::string& complaint);

/** The same, complaining at once. */
std::unique_ptr<CXMLReader> LoadFile(const std::string& path);

/** Loads a file in the same way into a document of the toolkit, and complains if it cannot. */
bool LoadDocument(const std::string& path, CXmlParser& document);

/** @return the engine's first complaint since the last load, after @p before; or an empty string.
 */
std::string FirstComplaint(const std::string& before);

/**
 * @return why the document that @p reader holds would not load again once it is saved, as "LINE:
 *         reason"; or an empty string.
 */
std::string WhyNotLoadedAgain(CXMLReader& reader);

/**
 * Complains if @p key cannot be one, or starts with another name than the root of @p reader, which
 * the library itself takes for success.
 *
 * @return Done if there is nothing to complain of.
 */
ExitStatus CheckKey(const std::string& file, const std::string& key, CXMLReader& reader);

/** @return the root element of the document that @p reader holds. */
const _xmlNode* RootOf(CXMLReader& reader);

/** A writer on the document of a reader, which keeps owning it. */
class GuestWriter
{
public:
    explicit GuestWriter(CXMLReader& reader) { m_writer.SetDataPtr(reader.GetDataPtr()); }
    ~GuestWriter() { m_writer.SetDataPtr(nullptr); }
    GuestWriter(const GuestWriter&) = delete;
    GuestWriter& operator=(const GuestWriter&) = delete;

    CXMLWriter& Get() { return m_writer; }

private:
    CXMLWriter m_writer;
};

#endif

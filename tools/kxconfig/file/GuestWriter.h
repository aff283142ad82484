#ifndef KX_TOOLS_GUESTWRITER_H
#define KX_TOOLS_GUESTWRITER_H

#include "CXMLReader.h"
#include "CXMLWriter.h"

/** A writer on the document of a reader, which keeps owning it: whatever happens, the writer lets
 * go of it. */
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

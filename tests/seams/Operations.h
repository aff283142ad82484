#ifndef KX_TESTS_SEAMS_OPERATIONS_H
#define KX_TESTS_SEAMS_OPERATIONS_H

// Every public operation of the five classes and every factory, with its main outcomes.

#include "CXMLReader.h"
#include "CXMLWriter.h"
#include "CXmlParser.h"

#include "support/Files.h"

#include <gtest/gtest.h>

#include <libxml/tree.h>
#include <libxml/xpath.h>

#include <iosfwd>
#include <memory>
#include <string>
#include <vector>

namespace kxtest
{

/** The files that the operations load and save, the same for every run. */
class OperationFiles
{
public:
    OperationFiles();

    /** @return the path of @p name, with the content that it has before every operation. */
    std::string Path(const std::string& name) const;

    /** @return the folder with a "/" at its end. */
    std::string Folder() const;

private:
    TemporaryFolder m_folder;
};

/** What one operation works on, created anew for each run. */
struct World
{
    explicit World(const OperationFiles& itsFiles) : files(itsFiles) {}
    ~World();
    World(const World&) = delete;
    World& operator=(const World&) = delete;

    void LoadReader(const std::string& name);
    void LoadWriter(const std::string& name);
    void LoadParser(const std::string& name);

    /** @return the first node of the parser's document that @p xpath selects. */
    CXmlNode Node(const std::string& xpath);

    /** Sets @ref node on the first node of cfg.xml that @p xpath selects. */
    void Select(const std::string& xpath, const std::string& name = "cfg.xml");

    xmlDocPtr ReaderDocument() { return static_cast<xmlDocPtr>(reader->GetDataPtr()); }

    std::string File(const std::string& name) const { return files.Path(name); }

    const OperationFiles& files;
    std::unique_ptr<CXMLReader> reader;
    std::unique_ptr<CXMLWriter> writer;
    std::unique_ptr<CXmlParser> parser;
    xmlXPathObjectPtr result = nullptr;
    xmlDocPtr document = nullptr; ///< a document of the test's own
    CXmlNode node;
};

struct Operation
{
    std::string name; ///< of its section in engine_calls.txt
    void (*prepare)(World&);
    void (*run)(World&); ///< one call of the operation
};

std::ostream& operator<<(std::ostream& out, const Operation& operation);

/** @return the operation's name, as the name of a test may be. */
std::string TestName(const testing::TestParamInfo<Operation>& info);

const std::vector<Operation>& AllOperations();

} // namespace kxtest

#endif

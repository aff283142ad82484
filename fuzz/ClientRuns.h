#ifndef KX_FUZZ_CLIENTRUNS_H
#define KX_FUZZ_CLIENTRUNS_H

// Runs of the client's core in a scratch folder, and what the fuzz target compares them with.

#include <nlohmann/json.hpp>

#include <string>
#include <vector>

class CXMLReader;

namespace kxfuzz
{

using Json = nlohmann::json;
using Arguments = std::vector<std::string>;

/** Aborts with @p what and @p about unless @p holds. */
void Require(bool holds, const char* what, const std::string& about);

/** The current folder of the process, in memory, removed at its end. */
class ScratchFolder
{
public:
    ScratchFolder();
    ~ScratchFolder();
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    /** Makes it the current folder. */
    void Enter() const;

    /** Removes all files in it. */
    void Clear() const;

private:
    std::string m_path;
};

/** An input of the fuzz target. */
struct ClientCase
{
    explicit ClientCase(const std::string& input);

    Arguments arguments; ///< the command first; none names a file outside the current folder
    std::string file;
};

struct Outcome
{
    int status;
    std::string out;
    std::string err;

    /** @return standard output as JSON, which it must be, with the exit status in it. */
    Json Answer() const;
};

/** Runs the client: every run ends with one of its statuses. */
Outcome Client(const Arguments& arguments);

bool AsksForJson(const Arguments& arguments);
Arguments WithJson(Arguments arguments);

/** @return whether the first name of @p key is the root's: another root counts as success. */
bool StartsAtRoot(CXMLReader& reader, const std::string& key);

} // namespace kxfuzz

#endif

#ifndef KX_TESTS_MODEL_MEMORYFILE_H
#define KX_TESTS_MODEL_MEMORYFILE_H

#include <string>

namespace kxmodel
{

/** A file that has a path and is nowhere on a disk: millions of them cost no wear and no litter. */
class MemoryFile
{
public:
    explicit MemoryFile(const std::string& content);
    ~MemoryFile();
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    const std::string& Path() const { return m_path; }

private:
    int m_descriptor;
    std::string m_path;
};

} // namespace kxmodel

#endif

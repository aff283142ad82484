#include "model/MemoryFile.h"

#include <stdexcept>

#include <sys/mman.h>
#include <unistd.h>

namespace kxmodel
{

MemoryFile::MemoryFile(const std::string& content) : m_descriptor(memfd_create("kx", MFD_CLOEXEC))
{
    if (m_descriptor < 0 ||
        write(m_descriptor, content.data(), content.size()) != static_cast<ssize_t>(content.size()))
    {
        throw std::runtime_error("cannot make a file in memory");
    }
    m_path = "/proc/self/fd/" + std::to_string(m_descriptor);
}

MemoryFile::~MemoryFile()
{
    close(m_descriptor);
}

} // namespace kxmodel

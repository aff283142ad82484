#include "file/Input.h"

#include <cstdio>
#include <istream>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>

namespace
{

[[noreturn]] void Throw(int reason)
{
    throw std::system_error(reason, std::generic_category());
}

/** Opens a pipe as soon as it has a writer, and all else without waiting. */
Descriptor OpenToRead(const std::string& path)
{
    struct stat status = {};
    const bool isPipe = stat(path.c_str(), &status) == 0 && S_ISFIFO(status.st_mode);
    const int flags = O_RDONLY | O_CLOEXEC | (isPipe ? 0 : O_NONBLOCK | O_NOCTTY);
    Descriptor file(open(path.c_str(), flags));
    if (!file)
    {
        ThrowSystemError();
    }
    return file;
}

/** @return the next bytes; none at the end. */
std::string ReadSome(int file)
{
    std::string bytes(65536, '\0');
    ssize_t size = 0;
    do
    {
        size = read(file, bytes.data(), bytes.size());
    } while (size < 0 && errno == EINTR);
    if (size < 0)
    {
        ThrowSystemError();
    }
    bytes.resize(static_cast<size_t>(size));
    return bytes;
}

/** The same of a stream. */
std::string ReadSome(std::istream& stream)
{
    std::string bytes(65536, '\0');
    stream.read(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    if (stream.bad())
    {
        Throw(EIO); // the stream keeps no reason
    }
    bytes.resize(static_cast<size_t>(stream.gcount()));
    return bytes;
}

/** @param source  a descriptor or a stream. */
template <class Source>
Descriptor CopyToMemory(Source& source, size_t most)
{
    Descriptor copy(memfd_create("kxconfig", MFD_CLOEXEC));
    if (!copy)
    {
        ThrowSystemError();
    }
    size_t size = 0;
    for (std::string bytes = ReadSome(source); !bytes.empty(); bytes = ReadSome(source))
    {
        size += bytes.size();
        if (size > most)
        {
            Throw(EFBIG);
        }
        WriteAll(copy.Get(), bytes);
    }
    return copy;
}

/** The engine would fetch "http://...", though a file can have that name. */
std::string AsFileName(const std::string& path)
{
    return path.find("://") == std::string::npos || path[0] == '/' ? path : "./" + path;
}

} // namespace

Input::Input(const std::string& path, size_t most) : m_path(AsFileName(path))
{
    const Descriptor file = OpenToRead(path);
    struct stat status = {};
    fstat(file.Get(), &status);
    if (S_ISDIR(status.st_mode))
    {
        Throw(EISDIR);
    }
    if (S_ISFIFO(status.st_mode))
    {
        const int pipe = file.Get();
        m_copy = CopyToMemory(pipe, most);
        m_path = m_copy.NameInProc();
    }
}

Input::Input(std::istream& stream, size_t most)
    : m_copy(CopyToMemory(stream, most)), m_path(m_copy.NameInProc())
{
}

#ifndef KX_TOOLS_DESCRIPTOR_H
#define KX_TOOLS_DESCRIPTOR_H

#include <cerrno>
#include <string>
#include <system_error>
#include <utility>

#include <unistd.h>

/** Throws std::system_error with the reason of the system call that failed last. */
[[noreturn]] inline void ThrowSystemError()
{
    throw std::system_error(errno, std::generic_category());
}

/** Owns an open file. */
class Descriptor
{
public:
    Descriptor() = default;

    /** @param number  a descriptor, or a negative number: none is open. */
    explicit Descriptor(int number) : m_number(number) {}
    ~Descriptor() { Close(); }
    Descriptor(Descriptor&& other) noexcept : m_number(std::exchange(other.m_number, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept
    {
        std::swap(m_number, other.m_number);
        return *this;
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    /** @return whether a file is open. */
    explicit operator bool() const { return m_number >= 0; }

    int Get() const { return m_number; }

    /** @return the name by which this process can open the file again, or link it. */
    std::string NameInProc() const { return "/proc/self/fd/" + std::to_string(m_number); }

private:
    void Close() const
    {
        if (m_number >= 0)
        {
            close(m_number);
        }
    }

    int m_number = -1;
};

/** Writes all of @p bytes. @throw std::system_error if the system takes no more of them. */
inline void WriteAll(int file, const std::string& bytes)
{
    for (size_t done = 0; done != bytes.size();)
    {
        const ssize_t written = write(file, bytes.data() + done, bytes.size() - done);
        if (written < 0 && errno != EINTR)
        {
            ThrowSystemError();
        }
        done += written < 0 ? 0 : static_cast<size_t>(written);
    }
}

#endif

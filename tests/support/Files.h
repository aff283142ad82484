#ifndef KX_TESTS_SUPPORT_FILES_H
#define KX_TESTS_SUPPORT_FILES_H

#include <string>

namespace kxtest
{

/** A folder that exists as long as the object does. */
class TemporaryFolder
{
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    /** @return the path of @p name in the folder; nothing is created. */
    std::string Path(const std::string& name) const;

    /** Writes a file into the folder. @return its path. */
    std::string Write(const std::string& name, const std::string& content) const;

private:
    std::string m_path;
};

void WriteFile(const std::string& path, const std::string& content);
std::string ReadFile(const std::string& path);
bool FileExists(const std::string& path);

} // namespace kxtest

#endif

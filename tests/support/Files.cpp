#include "support/Files.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>

#include <stdlib.h>

namespace kxtest
{

TemporaryFolder::TemporaryFolder()
{
    std::string pattern = (std::filesystem::temp_directory_path() / "kx-XXXXXX").string();
    if (mkdtemp(pattern.data()) == nullptr)
    {
        throw std::runtime_error("cannot make " + pattern);
    }
    m_path = pattern;
}

TemporaryFolder::~TemporaryFolder()
{
    std::error_code ignored;
    std::filesystem::remove_all(m_path, ignored);
}

std::string TemporaryFolder::Path(const std::string& name) const
{
    return m_path + "/" + name;
}

std::string TemporaryFolder::Write(const std::string& name, const std::string& content) const
{
    const std::string path = Path(name);
    WriteFile(path, content);
    return path;
}

void WriteFile(const std::string& path, const std::string& content)
{
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out << content;
    out.close();
    if (!out)
    {
        throw std::runtime_error("cannot write " + path);
    }
}

std::string ReadFile(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream content;
    content << in.rdbuf();
    if (!in)
    {
        throw std::runtime_error("cannot read " + path);
    }
    return content.str();
}

bool FileExists(const std::string& path)
{
    return std::filesystem::exists(path);
}

} // namespace kxtest

#include "Documents.h"

#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <stdexcept>

#include <stdlib.h>

namespace bench
{

namespace
{

namespace fs = std::filesystem;

class TemporaryFolder
{
public:
    TemporaryFolder()
    {
        std::string path = (fs::temp_directory_path() / "kx-bench-XXXXXX").string();
        if (mkdtemp(path.data()) == nullptr)
        {
            throw std::runtime_error("cannot make a folder in " +
                                     fs::temp_directory_path().string());
        }
        m_path = path;
    }
    ~TemporaryFolder()
    {
        std::error_code ignored;
        fs::remove_all(m_path, ignored);
    }

    std::string File(const std::string& name) const { return (m_path / name).string(); }

private:
    fs::path m_path;
};

const TemporaryFolder& Folder()
{
    static const TemporaryFolder folder;
    return folder;
}

std::string Numbered(const std::string& name, std::size_t number)
{
    return name + '-' + std::to_string(number) + ".xml";
}

/** @return the path of the document @p name, which is written if it is not there yet. */
std::string Document(const std::string& name, const std::function<void(std::ostream&)>& writeBody)
{
    const std::string path = Folder().File(name);
    if (fs::exists(path))
    {
        return path;
    }
    std::ofstream file(path);
    file << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<cfg>\n";
    writeBody(file);
    file << "</cfg>\n";
    if (!file.flush())
    {
        throw std::runtime_error("cannot write " + path);
    }
    return path;
}

void WriteChannel(std::ostream& out, std::size_t id)
{
    out << "  <channel id=\"" << id << "\">\n    <name>Channel " << id
        << "</name>\n    <unit>mA</unit>\n    <limit level=\"alarm\">" << id % 20 << "</limit>\n"
        << "  </channel>\n";
}

/** A configuration of about @p size bytes with a few settings ahead. */
std::string Configuration(std::size_t size)
{
    return Document(
        Numbered("configuration", size),
        [size](std::ostream& out)
        {
            out << "  <device>\n    <name>gateway</name>\n    <serial>4711</serial>\n  </device>\n";
            for (std::size_t id = 1; static_cast<std::size_t>(out.tellp()) < size; ++id)
            {
                WriteChannel(out, id);
            }
        });
}

std::string Attributes(std::size_t count)
{
    std::string attributes;
    for (std::size_t term = 0; term != count; ++term)
    {
        attributes += ' ' + TermName(term) + "=\"" + TermValue(term) + '"';
    }
    return attributes;
}

FirstRead Generated(const std::string& size, std::size_t bytes)
{
    return {"load and read, " + size,
            Configuration(bytes),
            "cfg",
            {"device", "name"},
            "",
            "",
            "/cfg/device/name",
            "gateway",
            true};
}

} // namespace

const std::vector<FirstRead>& FirstReads()
{
    static const std::vector<FirstRead> reads = []
    {
        std::vector<FirstRead> all = {Generated("2 KB", 2000), Generated("100 KB", 100000),
                                      Generated("5 MB", 5000000)};
        const std::vector<FirstRead> real = {
            {"load and read, fonts.conf",
             "/etc/fonts/fonts.conf",
             "fontconfig",
             {"description"},
             "",
             "",
             "/fontconfig/description",
             "Default configuration file",
             true},
            {"load and read, keyboards (240 KB)",
             "/usr/share/X11/xkb/rules/base.xml",
             "xkbConfigRegistry",
             {"modelList", "model", "configItem", "hwList", "hwId"},
             "",
             "",
             "/xkbConfigRegistry/modelList/model/configItem/hwList/hwId",
             "046d:c313",
             false}, // only the 91st of the models has a list of hardware
            {"load and read, MIME types (2.4 MB)",
             "/usr/share/mime/packages/freedesktop.org.xml",
             "mime-info",
             {"mime-type", "acronym"},
             "type",
             "application/xml",
             "/*/*[local-name()='mime-type'][@type='application/xml']/*[local-name()='acronym']",
             "XML",
             true},
        };
        for (const FirstRead& read : real)
        {
            if (fs::exists(read.path))
            {
                all.push_back(read);
            }
        }
        return all;
    }();
    return reads;
}

std::string Siblings(std::size_t count)
{
    return Document(Numbered("siblings", count),
                    [count](std::ostream& out)
                    {
                        // Some share a beginning with the name that is looked up, some do not.
                        const char* const names[] = {"option", "server", "client", "setting"};
                        for (std::size_t i = 1; i < count; ++i)
                        {
                            out << "  <" << names[i % 4] << ">" << i << "</" << names[i % 4]
                                << ">\n";
                        }
                        out << "  <service>" << kServiceValue << "</service>\n";
                    });
}

std::string Items(std::size_t count)
{
    return Document(Numbered("items", count),
                    [count](std::ostream& out)
                    {
                        for (std::size_t id = 1; id <= count; ++id)
                        {
                            out << "  <item id=\"" << id << "\"><name>" << ItemName(id)
                                << "</name></item>\n";
                        }
                    });
}

std::string ItemName(std::size_t id)
{
    return "item " + std::to_string(id);
}

std::string Texts(std::size_t count)
{
    return Document(Numbered("texts", count),
                    [count](std::ostream& out)
                    {
                        for (std::size_t i = 1; i <= count; ++i)
                        {
                            out << "  <item>" << ItemName(i) << "</item>\n";
                        }
                    });
}

std::string AllTexts(std::size_t count)
{
    std::string all = ItemName(1);
    for (std::size_t i = 2; i <= count; ++i)
    {
        all += '\n' + ItemName(i);
    }
    return all;
}

std::string Nested(std::size_t levels)
{
    return Document(Numbered("nested", levels),
                    [levels](std::ostream& out)
                    {
                        for (const std::string& name : NestedNames(levels))
                        {
                            out << "<other/><" << name << ">";
                        }
                        out << kNestedValue;
                        for (std::size_t level = levels; level != 0; --level)
                        {
                            out << "</" << NestedNames(level).back() << ">";
                        }
                    });
}

std::vector<std::string> NestedNames(std::size_t levels)
{
    std::vector<std::string> names;
    for (std::size_t level = 1; level <= levels; ++level)
    {
        names.push_back("level" + std::to_string(level));
    }
    return names;
}

std::string Attributed()
{
    return Document("attributed.xml",
                    [](std::ostream& out) {
                        out << "  <item" << Attributes(8) << "><name>" << kAttributedValue
                            << "</name></item>\n";
                    });
}

std::string TermName(std::size_t term)
{
    return std::string("attr") + static_cast<char>('a' + term % 8);
}

std::string TermValue(std::size_t term)
{
    return "value " + std::to_string(term % 8);
}

std::string Channels(std::size_t count)
{
    return Document(Numbered("channels", count),
                    [count](std::ostream& out)
                    {
                        for (std::size_t id = 1; id <= count; ++id)
                        {
                            WriteChannel(out, id);
                        }
                        out << "  <label>before</label>\n";
                    });
}

std::string FourAttributes()
{
    return Document("four-attributes.xml", [](std::ostream& out)
                    { out << "  <item" << Attributes(kFourAttributes) << "/>\n"; });
}

std::string ScratchFile(const std::string& name)
{
    return Folder().File(name);
}

bool IsUpdated(const std::string& path)
{
    std::ifstream file(path);
    const std::string text((std::istreambuf_iterator<char>(file)),
                           std::istreambuf_iterator<char>());
    return text.find("<label>after</label>") != std::string::npos &&
           text.find("</cfg>") != std::string::npos;
}

std::vector<std::size_t> Joined(std::vector<std::size_t> first,
                                const std::vector<std::size_t>& second)
{
    first.insert(first.end(), second.begin(), second.end());
    return first;
}

std::string Sized(const std::string& workload, std::size_t size)
{
    return workload + ' ' + std::to_string(size);
}

} // namespace bench

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include "support/Engine.h"
#include "support/Files.h"

#include <gtest/gtest.h>

#include <map>
#include <set>

// Every text that an update can reach alone is set to itself in files that other projects install;
// the saved file then holds the same tree.

using namespace kxtest;

namespace
{

std::string NameOf(const xmlNode* node)
{
    return reinterpret_cast<const char*>(node->name);
}

bool HoldsOnlyText(const xmlNode* node)
{
    return node->type == XML_ELEMENT_NODE && node->children != nullptr &&
           node->children->type == XML_TEXT_NODE && node->children->next == nullptr;
}

std::string AsXmlText(const xmlNode* text)
{
    std::string escaped;
    for (const char c : std::string(reinterpret_cast<const char*>(text->content)))
    {
        escaped += c == '&' ? "&amp;" : std::string(1, c);
    }
    return escaped;
}

/** Counts the elements below @p node that hold only text, by name. */
void CountTexts(const xmlNode* node, std::map<std::string, int>& counts)
{
    for (const xmlNode* child = node->children; child != nullptr; child = child->next)
    {
        if (child->type == XML_ELEMENT_NODE)
        {
            counts[NameOf(child)] += HoldsOnlyText(child);
            CountTexts(child, counts);
        }
    }
}

/** Sets each child of @p parent, and of its descendants, to itself if its name reaches it alone. */
int SetToItself(CXMLWriter& writer, xmlNode* parent)
{
    std::map<std::string, int> counts;
    CountTexts(parent, counts);
    int updates = 0;
    for (xmlNode* child = parent->children; child != nullptr; child = child->next)
    {
        if (HoldsOnlyText(child) && counts[NameOf(child)] == 1)
        {
            std::string value = AsXmlText(child->children);
            unsigned updated = 0;
            writer.XMLSetValue(parent, NameOf(child), value, updated);
            EXPECT_EQ(1u, updated) << NameOf(child);
            updates += static_cast<int>(updated);
        }
        if (child->type == XML_ELEMENT_NODE)
        {
            updates += SetToItself(writer, child);
        }
    }
    return updates;
}

std::string TreeOf(const std::string& file)
{
    CXMLReader reader(file);
    return Serialized(static_cast<xmlDocPtr>(reader.GetDataPtr()));
}

struct RealFile
{
    const char* name;
    const char* path;
    int leastUpdates; // counted by hand or safely below: the test must not pass by doing nothing
};

void PrintTo(const RealFile& file, std::ostream* out)
{
    *out << file.name;
}

class RoundTrip : public testing::TestWithParam<RealFile>
{
};

} // namespace

TEST_P(RoundTrip, SettingEachTextToItselfSavesTheSameTree)
{
    const TemporaryFolder folder;
    const std::string copy = folder.Write("copy.xml", ReadFile(GetParam().path));
    const std::string before = TreeOf(copy);
    {
        CXMLReader reader(copy);
        CXMLWriter writer;
        writer.SetDataPtr(reader.GetDataPtr());
        writer.SetPath(copy);
        const int updates =
            SetToItself(writer, xmlDocGetRootElement(static_cast<xmlDocPtr>(reader.GetDataPtr())));
        EXPECT_GE(updates, GetParam().leastUpdates);
        EXPECT_EQ(0, writer.SaveData());
        writer.SetDataPtr(nullptr);
    }
    EXPECT_EQ(before, TreeOf(copy));
}

INSTANTIATE_TEST_SUITE_P(
    RealFiles, RoundTrip,
    testing::Values(RealFile{"Fontconfig", "/etc/fonts/fonts.conf", 10},
                    RealFile{"MimeTypes", "/usr/share/mime/packages/freedesktop.org.xml", 100},
                    RealFile{"Keyboards", "/usr/share/X11/xkb/rules/base.xml", 500},
                    RealFile{"Gateway", KX_EXAMPLE_DATA "/gateway.xml", 15}),
    [](const testing::TestParamInfo<RealFile>& file) { return std::string(file.param.name); });

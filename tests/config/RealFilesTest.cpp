#include "CXMLReader.h"

#include <gtest/gtest.h>

#include <algorithm>

// Files that other projects install. The values were looked up in them by hand.

namespace
{

const char* const kFontconfig = "/etc/fonts/fonts.conf";
const char* const kMimeTypes = "/usr/share/mime/packages/freedesktop.org.xml";
const char* const kKeyboards = "/usr/share/X11/xkb/rules/base.xml";

std::string ValueIn(const char* file, const std::string& key)
{
    CXMLReader reader(file);
    EXPECT_NE(nullptr, reader.GetDataPtr()) << file;
    std::string value;
    EXPECT_EQ(0, reader.GetValue(key, value)) << key;
    return value;
}

} // namespace

TEST(RealFiles, Fontconfig)
{
    EXPECT_EQ("Default configuration file", ValueIn(kFontconfig, "fontconfig.description"));
    EXPECT_EQ("30", ValueIn(kFontconfig, "fontconfig.config.rescan.int"));
    EXPECT_EQ("/usr/share/fonts\n/usr/local/share/fonts\nfonts\n~/.fonts",
              ValueIn(kFontconfig, "fontconfig.dir"));
    // The description ahead suspends the condition, so that the first dir is taken by its name.
    EXPECT_EQ("/usr/share/fonts\nfonts", ValueIn(kFontconfig, "fontconfig.dir@prefix=xdg"));
    EXPECT_EQ("monospace\nsans-serif\nsans-serif",
              ValueIn(kFontconfig, "fontconfig.match@target=font|target=pattern.edit.string")
                  .substr(0, 31));
}

TEST(RealFiles, MimeTypes)
{
    const std::string xml = "mime-info.mime-type@type=application/xml.";
    EXPECT_EQ("XML", ValueIn(kMimeTypes, xml + "acronym"));
    EXPECT_EQ("eXtensible Markup Language", ValueIn(kMimeTypes, xml + "expanded-acronym"));
    EXPECT_EQ("Документ XML", ValueIn(kMimeTypes, xml + "comment@lang=ru"));
    EXPECT_EQ("Tài liệu XML", ValueIn(kMimeTypes, xml + "comment@lang=vi"));
    EXPECT_EQ("Atari 2600-rom",
              ValueIn(kMimeTypes,
                      "mime-info.mime-type@type=application/x-atari-2600-rom.comment@lang=sv"));
}

TEST(RealFiles, Keyboards)
{
    const std::string names =
        ValueIn(kKeyboards, "xkbConfigRegistry.modelList.model.configItem.name");
    EXPECT_EQ("pc86\npc101\npc102\npc104\npc104alt\n", names.substr(0, 32));
    EXPECT_NE(std::string::npos, names.find("\nsun_type7_euro_usb\n"));
    const std::string languages =
        ValueIn(kKeyboards, "xkbConfigRegistry.layoutList.layout.configItem.languageList.iso639Id");
    EXPECT_EQ("eng\ndrs", languages.substr(0, 7));
    EXPECT_EQ("grp",
              ValueIn(kKeyboards, "xkbConfigRegistry.optionList.group@allowMultipleSelection="
                                  "true.configItem.name")
                  .substr(0, 3));
}

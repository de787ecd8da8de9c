// IniHeader: the header section's names, its tags written and read back through files of every
// form, what makes it valid, and which product versions may read the file.
#include "tekit/ini/IniHeader.h"

#include "support/ScratchDirectory.h"
#include "tekit/paths/Path.h"
#include "tekit/toolbox/Version.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace tekit::testing {
namespace {

std::string S(DynamicString const& s) {
    return s.GetBufferReadPtr();
}

TEST(IniHeader, NamesAreTheDocumentedOnes) {
    std::pair<char const*, char const*> const names[] = {
        {IniHeader::kHeaderSectionName, "__Header__"},
        {IniHeader::kTypeTag, "Type"},
        {IniHeader::kFormatVersionTag, "Version"},
        {IniHeader::kProductNameTag, "ProductName"},
        {IniHeader::kProductVersionTag, "ProductVersion"},
        {IniHeader::kCompatibleProductVersionTag, "CompatibleProdVersion"},
        {IniHeader::kProductDisplayVersionTag, "ProductVersionString"},
        {IniHeader::kDescriptionTag, "Description"},
        {IniHeader::kPathTag, "Path"},
        {IniHeader::kCharEncodingTag, "CharEncoding"},
        {IniHeader::kSBCS.GetBufferReadPtr(), "SBCS"},
        {IniHeader::kDBCS.GetBufferReadPtr(), "DBCS"},
        {IniHeader::kUnicode.GetBufferReadPtr(), "Unicode"},
        {IniHeader::GetHeaderSectionName(), "__Header__"},
    };
    for (auto const& [name, expected] : names)
        EXPECT_STREQ(name, expected);
}

TEST(IniHeader, TagsWrittenFirstInTheDocumentReadBackFromEveryForm) {
    ScratchDirectory scratch("iniheader");
    IniHeader made("LimitsFile", "4.2.1.77", "4.0", 3, "Station \"A\" limits",
                   Path("C:\\data\\l.ini"));
    made.SetProductDisplayVersion("4.2 (Beta)");
    made.SetCharacterEncoding(IniHeader::kUnicode.GetBufferReadPtr());
    IniObj ini(false, DynamicString("[Limits]\nLow = 3\n"));
    made.Write(ini);
    char const* first = nullptr;
    ASSERT_EQ(Ini_NthSectionName(ini.GetHandle(), 1, &first), 1);
    EXPECT_STREQ(first, "__Header__");

    for (auto const& [binary, asText] : {std::pair(false, false), {true, false}, {true, true}}) {
        Path const file((scratch.Root() / "l.ini").string().c_str());
        ini.WriteFile(file, binary, asText);
        IniHeader const read(file);
        EXPECT_EQ(Ini_NumberOfSections(read.GetIniObj().GetHandle()), 1); // the header only
        EXPECT_TRUE(read.Exists() && read.IsValid());
        EXPECT_EQ(S(read.GetType()), "LimitsFile");
        EXPECT_EQ(read.GetFormatVersion(), 3);
        EXPECT_EQ(S(read.GetProductName()), "Orvane");
        EXPECT_EQ(S(read.GetProductVersion()), "4.2.1.77");
        EXPECT_EQ(S(read.GetCompatibleProductVersion()), "4.0");
        EXPECT_EQ(S(read.GetProductDisplayVersion()), "4.2 (Beta)");
        EXPECT_EQ(S(read.GetDescription()), "Station \"A\" limits");
        EXPECT_EQ(S(read.GetCharacterEncoding()), "Unicode");
        EXPECT_EQ(S(read.GetPath_InternalForUseWithOVFileHeaderOnly()), "C:\\data\\l.ini");
    }
}

TEST(IniHeader, ValidityWeighsTheSectionTheTypeAndTheVersion) {
    struct {
        char const* text;
        bool exists, valid;
        long version;
    } const cases[] = {
        {"[Other]\nType = X\n", false, false, 0},
        {"[__Header__]\nVersion = 3\n", true, false, 3},
        {"[__Header__]\nType = X\n", true, true, 0},
        {"[__Header__]\nType = X\nVersion = 3\n", true, true, 3},
        {"[__Header__]\nType = X\nVersion = three\n", true, false, 0},
    };
    for (auto const& c : cases) {
        IniObj ini(false, DynamicString(c.text));
        IniHeader const header(ini);
        EXPECT_EQ(header.Exists(), c.exists) << c.text;
        EXPECT_EQ(header.IsValid(), c.valid) << c.text;
        EXPECT_EQ(header.GetFormatVersion(), c.version) << c.text;
        EXPECT_EQ(S(header.GetCharacterEncoding()), "SBCS");
    }
}

TEST(IniHeader, CompatibleProductVersions) {
    struct {
        char const* compatible; // null: no tag
        char const* product;
        bool compatibleResult;
    } const cases[] = {
        {"4.0", "4.0", true},   {"4.0", "4.2.1.77", true}, {"4.0", "3.9.9", false},
        {nullptr, "1.0", true}, {nullptr, "x", false},     {"4.0 beta", "5.0", false},
        {"4.0.0.0", "4", true},
    };
    for (auto const& c : cases) {
        IniHeader header;
        if (c.compatible) {
            IniObj ini;
            ini.Set(IniHeader::kHeaderSectionName, IniHeader::kCompatibleProductVersionTag,
                    c.compatible);
            header.Read(ini);
        }
        EXPECT_EQ(header.IsCompatibleProductVersion(Version(c.product)), c.compatibleResult)
            << (c.compatible ? c.compatible : "(none)") << " vs " << c.product;
    }
}

} // namespace
} // namespace tekit::testing

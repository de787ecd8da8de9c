// The two binary INI forms: their layouts byte for byte, the magic test, round trips of all
// three forms, and untrusted files that are refused without harm.
#include "tekit/ini/IniObj.h"

#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/paths/Path.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

namespace tekit::testing {
namespace {

constexpr char kDocument[] = "[__Header__]\nType = \"Limits\"\n[Limits]\nLow = 3\nText = \"a b\"\n";
/// kDocument as the writer puts it inside the binary forms: CR LF line ends.
constexpr char kWrittenText[] = "[__Header__]\r\nType = \"Limits\"\r\n\r\n"
                                "[Limits]\r\nLow = 3\r\nText = \"a b\"\r\n\r\n";

std::uint32_t Le32(std::string const& bytes, std::size_t at) {
    auto const* p = reinterpret_cast<unsigned char const*>(bytes.data() + at);
    return std::uint32_t(p[0]) | std::uint32_t(p[1]) << 8 | std::uint32_t(p[2]) << 16 |
           std::uint32_t(p[3]) << 24;
}

std::string Le32Bytes(std::uint32_t v) {
    return {char(v), char(v >> 8), char(v >> 16), char(v >> 24)};
}

/// The compressed form assembled by hand: header fields as given, then `data`.
std::string CompressedForm(std::uint32_t offset, std::uint32_t length, std::string const& data) {
    return std::string("OrvaneBinary\0\0\0\0\0\0\0\0", 20) + Le32Bytes(offset) + Le32Bytes(0) +
           Le32Bytes(length) + data;
}

std::string Deflated(std::string const& text) {
    KaCompressor compressor;
    std::string out(std::size_t(compressor.ObsoleteCompressBound(text.size())), '\0');
    unsigned long size = out.size();
    EXPECT_EQ(compressor.ObsoleteCompress(reinterpret_cast<unsigned char*>(out.data()), &size,
                                          reinterpret_cast<unsigned char const*>(text.data()),
                                          text.size()),
              0);
    out.resize(size);
    return out;
}

/// The data-to-text encoding of `bytes`: a compressed string when they are a framed block.
std::string Encoded(std::string const& bytes) {
    char* text = ConvertDataToText(bytes.data(), int(bytes.size()));
    std::string const encoded = text;
    TBFree(text);
    return encoded;
}

class IniBinaryForms : public ::testing::Test {
protected:
    Path At(char const* name) const { return Path((m_scratch.Root() / name).string().c_str()); }
    static std::string Bytes(Path const& path) { return ReadFileBytes(path.CStr()); }
    static void Put(Path const& path, std::string const& bytes) {
        WriteFileBytes(path.CStr(), bytes);
    }

    ScratchDirectory m_scratch{"inibinary"};
    IniObj m_ini{false, DynamicString(kDocument)};
};

TEST_F(IniBinaryForms, CompressedFormLayoutFieldByField) {
    m_ini.WriteFile(At("c.bin"), true, false);
    std::string const file = Bytes(At("c.bin"));
    ASSERT_GE(file.size(), 32u);
    EXPECT_EQ(file.substr(0, 20), std::string("OrvaneBinary\0\0\0\0\0\0\0\0", 20));
    EXPECT_EQ(Le32(file, 20), 32u);                  // data offset
    EXPECT_EQ(Le32(file, 24), 0u);                   // reserved
    EXPECT_EQ(Le32(file, 28), strlen(kWrittenText)); // text length
    EXPECT_EQ(file[32], '\x78');                     // a zlib stream follows
    std::string text(strlen(kWrittenText), '\0');
    unsigned long size = text.size();
    KaCompressor compressor;
    EXPECT_EQ(compressor.ObsoleteUncompress(
                  reinterpret_cast<unsigned char*>(text.data()), &size,
                  reinterpret_cast<unsigned char const*>(file.data()) + 32, file.size() - 32),
              0);
    EXPECT_EQ(text, kWrittenText);
}

TEST_F(IniBinaryForms, TextFormLayoutIsTheMagicAndACompressedString) {
    m_ini.WriteFile(At("t.bin"), true, true);
    std::string const file = Bytes(At("t.bin"));
    EXPECT_EQ(file.substr(0, 22), "OrvaneBinaryTextJ3p2LV");
    DynamicString text;
    KaCompressor compressor;
    compressor.CompressedStringToString(DynamicString(file.c_str() + 16), text);
    EXPECT_STREQ(text.GetBufferReadPtr(), kWrittenText);
}

TEST_F(IniBinaryForms, AllThreeFormsAndHandBuiltFilesReadBackEqual) {
    struct {
        char const* name;
        bool binary, asText;
    } const forms[] = {{"plain.ini", false, false}, {"c.bin", true, false}, {"t.bin", true, true}};
    for (auto const& form : forms) {
        m_ini.WriteFile(At(form.name), form.binary, form.asText);
        IniObj back(false, At(form.name));
        EXPECT_TRUE(back.Compare(m_ini)) << form.name;
    }
    // Files made outside the writer: LF line ends, and the text form's magic read first although
    // the file also begins with "OrvaneBinary".
    Put(At("hand.bin"), CompressedForm(32, strlen(kDocument), Deflated(kDocument)));
    DynamicString compressed;
    KaCompressor().StringToCompressedString(DynamicString(kDocument), compressed);
    Put(At("hand.txt"), "OrvaneBinaryText" + std::string(compressed.GetBufferReadPtr()));
    for (char const* name : {"hand.bin", "hand.txt"}) {
        IniObj back(false, At(name));
        EXPECT_TRUE(back.Compare(m_ini)) << name;
    }
}

TEST_F(IniBinaryForms, UntrustedFilesAreRefusedAndLeaveTheObject) {
    std::string const good = Deflated(kDocument);
    std::uint32_t const length = strlen(kDocument);
    struct {
        char const* name;
        std::string bytes;
        std::string reason; // a part of the description
    } const cases[] = {
        {"19 bytes", std::string("OrvaneBinary\0\0\0\0\0\0\0", 19),
         "it ends inside the 32-byte header of the compressed form."},
        {"text form 19 bytes", "OrvaneBinaryTextJ3p", "or a length that no encoded data has."},
        {"text form absurd size",
         "OrvaneBinaryText" + Encoded("PMCZ" + Le32Bytes(0xFFFFFFF0u) + good), "more than its"},
        {"bad offset", CompressedForm(33, length, good),
         "its header puts the compressed data at offset 33 instead of 32."},
        {"absurd length", CompressedForm(32, 0xFFFFFFFFu, good),
         "more than its " + std::to_string(good.size()) + " bytes of compressed data can hold."},
        {"length too large", CompressedForm(32, length + 1, good),
         "does not inflate to the " + std::to_string(length + 1) +
             " bytes of text that its "
             "header states."},
        {"length too small", CompressedForm(32, length - 1, good),
         "bytes of text that its header states."},
        {"truncated data", CompressedForm(32, length, good.substr(0, good.size() / 2)),
         "bytes of text that its header states."},
        {"header only", CompressedForm(32, 0, ""), "does not inflate to the 0 bytes"},
        {"bad characters", "OrvaneBinaryTextJ3p2LV#$%", "or a length that no encoded data has."},
        {"NUL in text", std::string("OrvaneBinaryTextJ3p2LV\0abc", 26),
         "or a length that no encoded data has."},
    };
    IniObj ini(false, DynamicString("[Keep]\nx = 1\n"));
    for (auto const& c : cases) {
        Put(At("bad.bin"), c.bytes);
        TEException const e = Raised([&] { ini.ReadFile(At("bad.bin")); });
        EXPECT_EQ(e.GetErrorCode(), TE_BAD_FILE_FORMAT) << c.name;
        EXPECT_STREQ(e.GetFunctionName(), "IniObj::ReadAsBinary") << c.name;
        std::string const description = e.GetDescription();
        EXPECT_TRUE(description.starts_with("'" + std::string(At("bad.bin").CStr()) +
                                            "' is not a valid binary INI file: "))
            << description;
        EXPECT_NE(description.find(c.reason), std::string::npos) << c.name << ": " << description;
        IniObj keep(false, DynamicString("[Keep]\nx = 1\n"));
        EXPECT_TRUE(ini.Compare(keep)) << c.name;
    }

    // Short files without a whole magic, and empty ones, are INI text.
    for (char const* text : {"", "[A]\nb = 1\n", "OrvaneBin"}) {
        Put(At("short.ini"), text);
        ini.ReadFile(At("short.ini"));
        IniObj expected(false, DynamicString(text));
        EXPECT_TRUE(ini.Compare(expected)) << text;
    }
}

} // namespace
} // namespace tekit::testing

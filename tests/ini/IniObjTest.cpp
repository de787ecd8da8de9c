// IniObj: typed values and their failures, whole documents in strings, comparison and
// copying, and saves in every form that fail without touching the target.
#include "tekit/ini/IniObj.h"

#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/paths/Path.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>

namespace fs = std::filesystem;

namespace tekit::testing {
namespace {

std::string Text(IniObj& ini, bool crlf = false) {
    DynamicString out;
    ini.WriteString(out, false, crlf);
    return out.GetBufferReadPtr();
}

IniObj* Parsed(char const* text) {
    return new IniObj(false, DynamicString(text));
}

TEST(IniObj, TypedValuesRoundTripAndAbsentOnesLeaveTheOutput) {
    IniObj ini;
    unsigned char const bytes[] = {0, 1, 0xFE, 0xFF, 7};
    ini.Set("S", "Long", -2147483647L - 1);
    ini.Set("S", "ULong", 4294967295UL);
    ini.Set("S", "Double", 2.5);
    ini.Set("S", "Bool", true);
    ini.Set("S", "Text", DynamicString("tab\there \"q\""));
    ini.Set("S", "Path", Path("C:\\dir\\a.ini"));
    ini.Set("S", "Data", bytes, long(sizeof bytes));
    ini.SetRaw("S", "Raw", "a\\tb");

    long l = 0;
    unsigned long u = 0;
    double d = 0;
    bool b = false;
    DynamicString s, raw;
    Path p;
    char* copy = nullptr;
    unsigned char* data = nullptr;
    long size = 0;
    EXPECT_TRUE(ini.Get("S", "Long", l) && l == -2147483647L - 1);
    EXPECT_TRUE(ini.Get("S", "ULong", u) && u == 4294967295UL);
    EXPECT_TRUE(ini.Get("S", "Double", d) && d == 2.5);
    EXPECT_TRUE(ini.Get("S", "Bool", b) && b);
    EXPECT_TRUE(ini.Get("S", "Text", s));
    EXPECT_STREQ(s.GetBufferReadPtr(), "tab\there \"q\"");
    EXPECT_TRUE(ini.GetRaw("S", "Text", raw));
    EXPECT_STREQ(raw.GetBufferReadPtr(), "tab\\there \\\"q\\\"");
    EXPECT_TRUE(ini.Get("S", "Path", p));
    EXPECT_STREQ(p.CStr(), "C:\\dir\\a.ini");
    ASSERT_TRUE(ini.Get("S", "Raw", &copy));
    EXPECT_STREQ(copy, "a\tb");
    TBFree(copy);
    ASSERT_TRUE(ini.Get("S", "Data", &data, &size));
    EXPECT_EQ(std::string(data, data + size), std::string(bytes, bytes + sizeof bytes));
    TBFree(data);

    IniSection section = nullptr;
    ASSERT_TRUE(ini.GetSectionPtr("S", section));
    ini.SetSP(section, "Long", 12L);
    EXPECT_TRUE(ini.GetSP(section, "Long", l) && l == 12);
    EXPECT_TRUE(ini.GetRawSP(section, "Raw", raw));
    EXPECT_STREQ(raw.GetBufferReadPtr(), "a\\tb");

    l = 99;
    bool converted = true;
    EXPECT_FALSE(ini.Get("S", "Missing", l));
    EXPECT_FALSE(ini.Get("Nowhere", "Long", l, converted));
    EXPECT_FALSE(converted);
    EXPECT_FALSE(ini.GetSectionPtr("Nowhere", section));
    EXPECT_EQ(l, 99);
}

TEST(IniObj, ValuesThatDoNotConvertRaiseOrReportInTheFoundFlagForm) {
    IniObj ini(false, DynamicString("[S]\nN = 12x\nB = yes\nD = 1..2\n"));
    long l = 5;
    bool b = false, converted = true;
    double d = 0;
    EXPECT_RAISES_IN(ini.Get("S", "N", l), TE_INVALID_OR_OUT_OF_RANGE, "IniObj::Get",
                     "The INI value is not an integer in range. Section 'S', tag 'N'.");
    EXPECT_RAISES_IN(ini.Get("S", "B", b), TE_INVALID_OR_OUT_OF_RANGE, "IniObj::Get");
    EXPECT_RAISES_IN(ini.Get("S", "D", d), TE_INVALID_OR_OUT_OF_RANGE, "IniObj::Get");
    EXPECT_TRUE(ini.Get("S", "N", l, converted));
    EXPECT_FALSE(converted);
    EXPECT_EQ(l, 5);
    EXPECT_TRUE(ini.Get("S", "B", b, converted));
    EXPECT_FALSE(converted);
    EXPECT_RAISES_IN(ini.Set("S", "", 1L), TE_INVALID_OR_OUT_OF_RANGE, "IniObj::Set");
    EXPECT_RAISES_IN(IniObj(false, "no-such-locale"), TE_INVALID_OR_OUT_OF_RANGE, "IniObj::IniObj");
}

TEST(IniObj, StringsCarryTheTextOrTheTextBinaryForm) {
    IniObj ini(false, DynamicString("[B]\nx = 1\n[A]\ny = \"two\"\n"));
    EXPECT_EQ(Text(ini), "[B]\nx = 1\n\n[A]\ny = \"two\"\n\n");
    EXPECT_EQ(Text(ini, true), "[B]\r\nx = 1\r\n\r\n[A]\r\ny = \"two\"\r\n\r\n");
    DynamicString packed;
    ini.WriteString(packed, true, false);
    EXPECT_TRUE(packed.StartsWith("OrvaneBinaryTextJ3p2LV"));
    IniObj back(false, packed);
    EXPECT_TRUE(back.Compare(ini));

    // A failed read leaves the object as it was.
    EXPECT_RAISES_IN(back.ReadString(DynamicString("OrvaneBinaryText#!")), TE_BAD_FILE_FORMAT,
                     "IniObj::ReadString");
    EXPECT_TRUE(back.Compare(ini));
    back.ReadString(DynamicString("[C]\nz = 3\n")); // replaces the content
    EXPECT_EQ(Text(back), "[C]\nz = 3\n\n");
}

TEST(IniObj, CompareCopyAndOrder) {
    IniObj a(false, DynamicString("[B]\nx = 1\n[A]\ny = 2\n"));
    struct {
        char const* text;
        bool equal;
    } const cases[] = {
        {"[B]\nx = 1\n[A]\ny = 2\n", true},
        {"[A]\ny = 2\n[B]\nx = 1\n", false},
        {"[B]\nx = \"1\"\n[A]\ny = 2\n", false},
        {"[B]\nx = 1\n[A]\ny = 3\n", false},
        {"[B]\nx = 1\n[A]\n", false},
        {"[B]\nx = 1\n[A]\nY = 2\n", false},
    };
    for (auto const& c : cases) {
        IniObj b(false, DynamicString(c.text));
        EXPECT_EQ(a.Compare(b), c.equal) << c.text;
    }

    IniObj sorted(true, DynamicString("[B]\nx = 1\n[A]\ny = 2\n"));
    EXPECT_EQ(Text(sorted), "[A]\ny = 2\n\n[B]\nx = 1\n\n");
    sorted.DisableSorting();
    sorted.Set("0", "t", 1L);
    EXPECT_EQ(Text(sorted), "[A]\ny = 2\n\n[B]\nx = 1\n\n[0]\nt = 1\n\n");
    a.Sort();
    sorted.SortInternally();
    long v = 0;
    EXPECT_TRUE(sorted.Get("0", "t", v) && v == 1);
    sorted.DisableInternalSorting();

    IniObj target(false, DynamicString("[A]\nold = 1\n"));
    EXPECT_TRUE(target.CopySection(a, "A", false));
    EXPECT_EQ(Text(target), "[A]\nold = 1\ny = 2\n\n");
    EXPECT_TRUE(target.CopySection(a, "A", true));
    EXPECT_EQ(Text(target), "[A]\ny = 2\n\n");
    EXPECT_FALSE(target.CopySection(a, "None", true));
}

class IniObjFile : public ::testing::Test {
protected:
    Path At(char const* name) const { return Path((m_scratch.Root() / name).string().c_str()); }
    static std::string Bytes(Path const& path) { return ReadFileBytes(path.CStr()); }
    bool TemporaryLeft() const {
        for (auto const& entry : fs::directory_iterator(m_scratch.Root()))
            if (entry.path().filename().string().starts_with("ini$$"))
                return true;
        return false;
    }

    ScratchDirectory m_scratch{"iniobj"};
};

TEST_F(IniObjFile, MissingOrUnreadableFilesRaiseAndLeaveTheObject) {
    std::unique_ptr<IniObj> ini(Parsed("[S]\nx = 1\n"));
    std::string const missing = At("missing.ini").CStr();
    EXPECT_RAISES_IN(ini->ReadFile(At("missing.ini")), TE_FILE_NOT_FOUND, "IniObj::ReadFile",
                     ("Could not find file '" + missing +
                      "'. Make sure that the file exists, that you have permission to read it, "
                      "and that no other application has it locked.")
                         .c_str());
    ini->WriteFile(At("a.ini"));
    {
        ScopedFault const fault(FaultKind::Read, 1, native::kAccessDenied);
        EXPECT_RAISES_IN(ini->ReadFile(At("a.ini")), TE_UNABLE_TO_OPEN_FILE,
                         "IniObj::ReadAsBinary");
    }
    {
        ScopedFault const fault(FaultKind::Open, 1, native::kAccessDenied);
        EXPECT_RAISES_IN(ini->ReadFile(At("a.ini")), TE_UNABLE_TO_OPEN_FILE, "IniObj::ReadFile");
    }
    EXPECT_EQ(Text(*ini), "[S]\nx = 1\n\n");
}

TEST_F(IniObjFile, FailedSavesInEveryFormLeaveTheTargetAndNoTemporaryFile) {
    struct {
        char const* name;
        FaultKind kind;
        long error;
        TEError code;
    } const faults[] = {
        {"DiskFull", FaultKind::Write, native::kDiskFull, TE_DISK_FULL},
        {"FlushFails", FaultKind::Flush, native::kDiskFull, TE_DISK_FULL},
        {"RenameFails", FaultKind::Rename, native::kAccessDenied, TE_ACCESS_DENIED},
        {"TemporaryRefused", FaultKind::TemporaryFile, native::kAccessDenied, TE_ACCESS_DENIED},
    };
    struct {
        bool binary, asText;
        char const* function;
    } const forms[] = {{false, false, "IniObj::WriteFile"},
                       {true, false, "IniObj::WriteAsBinary"},
                       {true, true, "IniObj::WriteAsBinary"}};
    std::unique_ptr<IniObj> ini(Parsed("[S]\nx = 1\n"));
    Path const target = At("target.ini");
    WriteFileBytes(target.CStr(), "before");
    for (auto const& form : forms)
        for (auto const& f : faults) {
            SCOPED_TRACE(std::string(f.name) + (form.binary ? form.asText ? " text" : " bin" : ""));
            ScopedFault const fault(f.kind, 1, f.error);
            EXPECT_RAISES_IN(ini->WriteFile(target, form.binary, form.asText), f.code,
                             form.function);
            EXPECT_TRUE(fault.Fired());
            EXPECT_EQ(Bytes(target), "before");
            EXPECT_FALSE(TemporaryLeft());
        }

    fs::permissions(target.CStr(),
                    fs::perms::owner_write | fs::perms::group_write | fs::perms::others_write,
                    fs::perm_options::remove);
    for (auto const& form : forms)
        EXPECT_RAISES_IN(ini->WriteFile(target, form.binary, form.asText), TE_ACCESS_DENIED,
                         form.function,
                         ("Could not write to file '" + std::string(target.CStr()) +
                          "' because it is read-only. Clear its read-only attribute or save it "
                          "under another name.")
                             .c_str());
    EXPECT_EQ(Bytes(target), "before");
}

} // namespace
} // namespace tekit::testing

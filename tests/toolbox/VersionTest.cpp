// Product versions: what parses, the text written back, and the order of versions.
#include "tekit/toolbox/Version.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>

namespace {

using namespace tekit;

TEST(Version, TextParsesToItsPartsOrIsInvalid) {
    struct {
        char const* text;
        bool valid;
        unsigned major, minor, patch, build;
        int parts;
        char const* written;
    } const cases[] = {
        // clang-format off
        {"4.2.1.77", true, 4, 2, 1, 77, 4, "4.2.1.77"},
        {"4", true, 4, 0, 0, 0, 1, "4"},
        {"04.2", true, 4, 2, 0, 0, 2, "4.2"},
        {"4294967295.0", true, 4294967295u, 0, 0, 0, 2, "4294967295.0"},
        {"4294967296", false, 0, 0, 0, 0, 0, ""},
        {"", false, 0, 0, 0, 0, 0, ""},
        {"4.", false, 0, 0, 0, 0, 0, ""},
        {".4", false, 0, 0, 0, 0, 0, ""},
        {"4..1", false, 0, 0, 0, 0, 0, ""},
        {"1.2.3.4.5", false, 0, 0, 0, 0, 0, ""},
        {"4.2 beta", false, 0, 0, 0, 0, 0, ""},
        {" 4.2", false, 0, 0, 0, 0, 0, ""},
        {"+4", false, 0, 0, 0, 0, 0, ""},
        {"4.x", false, 0, 0, 0, 0, 0, ""},
        // clang-format on
    };
    for (auto const& c : cases) {
        Version const v(c.text);
        EXPECT_EQ(std::tuple(v.IsValid(), v.GetMajor(), v.GetMinor(), v.GetPatch(), v.GetBuild(),
                             v.GetNumParts(), std::string(v.ToString().GetBufferReadPtr())),
                  std::tuple(c.valid, c.major, c.minor, c.patch, c.build, c.parts,
                             std::string(c.written)))
            << c.text;
    }
    EXPECT_FALSE(Version(static_cast<char const*>(nullptr)).IsValid());
    EXPECT_EQ(std::string(Version(1, 2).ToString().GetBufferReadPtr()), "1.2.0.0");
}

TEST(Version, OrderIsPartByPartWithInvalidLowest) {
    struct {
        char const* a;
        char const* b;
        int order;
    } const cases[] = {
        {"4.2", "4.2.0.0", 0},    {"4.10", "4.9", 1},
        {"4.2.1", "4.2.0.99", 1}, {"3.99", "4", -1},
        {"x", "0", -1},           {"x", "", 0},
        {"0.0.0.1", "0", 1},      {"1.0.0.4294967295", "1.0.1", -1},
    };
    for (auto const& c : cases) {
        Version const a(c.a), b(c.b);
        EXPECT_EQ(a.Compare(b), c.order) << c.a << " vs " << c.b;
        EXPECT_EQ(b.Compare(a), -c.order) << c.b << " vs " << c.a;
        EXPECT_EQ(a == b, c.order == 0);
        EXPECT_EQ(a < b, c.order < 0);
    }
}

} // namespace

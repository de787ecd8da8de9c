// The lint's reading of INI text must agree with the library's reader: on random texts built
// from the grammar's tokens, the sections and items it rebuilds from lines are those of an
// object the reader fills from the same text.
#include "IniLines.h"

#include "tekit/ini/Ini.h"

#include <gtest/gtest.h>

#include <random>
#include <sstream>
#include <string_view>
#include <vector>

using namespace tekit::tool;

namespace {

/// The object the library's reader makes of `text`, listed one section or item per line.
std::string ReadByLibrary(std::string const& text) {
    IniHandle ini = Ini_New(0, nullptr);
    TextSource source{text};
    LineFile reader = NewTextReader(source);
    EXPECT_EQ(Ini_ReadGeneric(ini, ReadTextLine, reader), 0);
    LineFile_Dispose(reader);
    std::ostringstream out;
    for (int s = 1; s <= Ini_NumberOfSections(ini); ++s) {
        IniSection section = nullptr;
        Ini_NthSection(ini, s, &section);
        char const* name = nullptr;
        int line = 0;
        Ini_SectionInfoSP(ini, section, &name, &line);
        out << line << " [" << name << "]\n";
        for (int i = 1; i <= Ini_NumberOfItemsSP(ini, section); ++i) {
            char const *tag = nullptr, *value = nullptr;
            int quoted = 0;
            Ini_NthItemSP(ini, section, i, &tag, &value, &line, &quoted);
            out << line << " <" << tag << "> <" << value << "> " << quoted << '\n';
        }
    }
    Ini_Dispose(ini);
    return out.str();
}

std::string ReadByLint(std::string const& text) {
    std::ostringstream out;
    for (IniSectionView const& section : BuildSections(ReadIniLines(text))) {
        out << section.line << " [" << section.name << "]\n";
        for (IniItemView const& item : section.items)
            out << item.line << " <" << item.tag << "> <" << item.value << "> " << item.quoted
                << '\n';
    }
    return out.str();
}

/// A text of a few lines, each a handful of the grammar's tokens, with every kind of line end.
std::string RandomText(std::mt19937& random) {
    static char const* const kTokens[] = {
        "[",           "]",           "=",           ";",
        " ",           "\t",          "a",           "B",
        "\"",          "\"",          " Line",       "1",
        "2",           "0001",        "0002",        "0000",
        "3",           "\v",          "T",           "x = ",
        "T Line",      " = \"",       "[S]",         "[S]",
        "[S ]",        "T Line1 = p", "T Line2 = q", "T Line0003 = \"r\"",
        "U Line1 = s", " Line1 = t",  "=\"\"",       "\x93"};
    static std::string_view const kEnds[] = {"\n",   "\r\n", "\r",
                                             "\n\r", "\n\n", std::string_view("\0", 1)};
    std::string text;
    int const lines = static_cast<int>(random() % 12);
    for (int l = 0; l < lines; ++l) {
        if (random() % 40 == 0)
            text += "[S]\nT = " + std::string(650 + random() % 20, 'v'); // a line over the limit
        int const tokens = static_cast<int>(random() % 7);
        for (int t = 0; t < tokens; ++t)
            text += kTokens[random() % std::size(kTokens)];
        text += kEnds[random() % std::size(kEnds)];
    }
    return text;
}

TEST(IniLines, RebuildTheSectionsAndItemsOfTheLibrarysReader) {
    std::mt19937 random(20240613);
    for (int round = 0; round < 3000; ++round) {
        std::string const text = RandomText(random);
        ASSERT_EQ(ReadByLint(text), ReadByLibrary(text))
            << "text: " << ::testing::PrintToString(text);
    }
}

TEST(IniLines, CountTheLinesAWriteDropsAndFindWhatLintReports) {
    struct {
        char const* text;
        int comments, ignored;
        std::vector<int> problemLines;
    } const cases[] = {
        {"[S]\nT = 1\n", 0, 0, {}},
        {"; c\n  ;c\n[S]\n;T = 1\n", 3, 0, {}},
        {"T = 1\n[S]\nT =\n[S] x\n", 0, 3, {1, 3, 4}},
        {"[S]\nT = 1\nT = 2\n[S]\n", 0, 0, {3, 4}},
        {"[S]\nV Line1 = a\nV Line2 = b\nV = c\nV Line3 = d\n", 0, 0, {4, 5}},
    };
    for (auto const& c : cases) {
        std::vector<IniLine> const lines = ReadIniLines(c.text);
        DroppedLines const dropped = CountDroppedLines(lines);
        EXPECT_EQ(dropped.comments, c.comments) << c.text;
        EXPECT_EQ(dropped.ignored, c.ignored) << c.text;
        std::vector<int> problemLines;
        for (IniProblem const& problem : FindIniProblems(lines))
            problemLines.push_back(problem.line);
        EXPECT_EQ(problemLines, c.problemLines) << c.text;
    }
}

} // namespace

// Message tables (RString) and lookup strings.
#include "tekit/errors/RString.h"
#include "tekit/errors/LookupString.h"
#include "tekit/strings/StaticString.h"
#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cctype>
#include <cstring>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace tekit {
namespace {

/// Every test starts and ends with the built-in table.
class MessageTable : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
    void TearDown() override { RString::ResetStrings(); }
};

std::vector<std::string> Keys(char const* section) {
    StringVector keys;
    RString::GetSectionTags(section, keys);
    std::vector<std::string> out;
    for (DynamicString const& key : keys)
        out.emplace_back(key.GetBufferReadPtr());
    return out;
}

TEST_F(MessageTable, FoundMessageRefersIntoTheTableAndIsNotOwned) {
    bool found = false;
    auto first = std::make_unique<RString>("ERR_DESCR", "CANT_FIND_FILE", "default", &found);
    EXPECT_TRUE(found);
    EXPECT_STREQ(*first, "Could not find file '%1'.");
    RString const second("ERR_DESCR", "CANT_FIND_FILE");
    EXPECT_EQ(&first->GetString(), &second.GetString());
    first.reset(); // must not free the table's text
    EXPECT_STREQ(second, "Could not find file '%1'.");
}

TEST_F(MessageTable, DefaultTextIsCopiedAndOwned) {
    char text[] = "caller's default";
    bool found = true;
    auto message = std::make_unique<RString>("ERR_DESCR", "NO_SUCH_KEY", text, &found);
    EXPECT_FALSE(found);
    text[0] = 'X';
    EXPECT_STREQ(*message, "caller's default");

    RString copy(*message);
    RString assigned("ERRORS", "STRING_NOT_IN_TABLE");
    assigned = *message;
    message.reset(); // the copies own texts of their own
    EXPECT_STREQ(copy, "caller's default");
    EXPECT_STREQ(assigned, "caller's default");
    EXPECT_STREQ(RString(std::move(copy)), "caller's default");
}

TEST_F(MessageTable, MissingKeyWithoutDefaultShowsTheTablesOwnMessage) {
    bool found = true;
    EXPECT_STREQ(RString("ERR_DESCR", "NO_SUCH_KEY", nullptr, &found),
                 "String not found in the language resource files");
    EXPECT_FALSE(found);
    RString::SetString("ERRORS", "STRING_NOT_IN_TABLE", "Texte introuvable");
    EXPECT_STREQ(RString("ERR_DESCR", "NO_SUCH_KEY"), "Texte introuvable");
}

TEST_F(MessageTable, WithoutATableOnlyTheConstantOrTheDefaultShows) {
    RString::RemoveGlobalStringTable();
    bool found = true;
    EXPECT_STREQ(RString("ERR_DESCR", "CANT_FIND_FILE", nullptr, &found),
                 "String Not Found In Table");
    EXPECT_FALSE(found);
    EXPECT_STREQ(RString("ERR_DESCR", "CANT_FIND_FILE", "fallback"), "fallback");
    RString::InitGlobalStringTable();
    EXPECT_STREQ(RString("ERR_DESCR", "CANT_FIND_FILE"), "Could not find file '%1'.");
}

TEST_F(MessageTable, LoadedRowsAddAndReplaceUntilReset) {
    RString const before("ERR_DESCR", "CANT_FIND_FILE");
    RString::SetString("ERR_DESCR", "CANT_FIND_FILE", "Fichier '%1' introuvable.");
    RString::SetString("MY_SECTION", "GREETING", "Hello");
    EXPECT_STREQ(RString("MY_SECTION", "GREETING"), "Hello");
    EXPECT_STREQ(RString("ERR_DESCR", "CANT_FIND_FILE"), "Fichier '%1' introuvable.");
    EXPECT_STREQ(before, "Could not find file '%1'."); // a handle keeps its text until reset
    EXPECT_STREQ(RString("my_section", "GREETING", "none"), "none");

    RString::ResetStrings();
    EXPECT_STREQ(RString("MY_SECTION", "GREETING", "gone"), "gone");
}

TEST_F(MessageTable, IsReadyOnlyBetweenFinishedLoadingAndTheNextResetOrRemoval) {
    EXPECT_FALSE(RString::GlobalStringTableIsReady());
    RString::FinishedLoadingStrings();
    EXPECT_TRUE(RString::GlobalStringTableIsReady());
    RString::RemoveGlobalStringTable();
    EXPECT_FALSE(RString::GlobalStringTableIsReady());
}

TEST_F(MessageTable, SectionTagsListEveryKeyOfASectionInOrder) {
    std::vector<std::string> const errors = Keys("TE_ERRORS");
    EXPECT_EQ(errors.size(), 159u); // every TEError symbol and USER_DEFINED_ERR_CODE
    EXPECT_TRUE(std::is_sorted(errors.begin(), errors.end()));

    RString::SetString("ERRORS", "A_NEW_KEY", "text");
    EXPECT_EQ(Keys("ERRORS").front(), "A_NEW_KEY");
    EXPECT_TRUE(Keys("NO_SUCH_SECTION").empty());
}

TEST_F(MessageTable, BuiltInDescriptionsKeepTheirExactTextsAndPlaceholders) {
    std::pair<char const*, char const*> const rows[] = {
        {"COMPRESS_OP_FAILED",
         "Unable to perform compression or decompression operation (code: %1)."},
        {"INVALID_PATHNAME_1", "Invalid path: '%1'"},
        {"ERR_RANGE_OPEN_ENDED_MUST_BE_LAST_1_2",
         "Error parsing range '%1'.  Open-ended element '%2' is not the final item in the list."},
        {"REGEXPR_EmptyLeftSide", "Left side of '|' is empty"},
    };
    for (auto const& [key, text] : rows)
        EXPECT_STREQ(RString("ERR_DESCR", key), text) << key;
    // A key that ends in argument numbers ("..._1_2") has a placeholder for each of them.
    for (std::string const& key : Keys("ERR_DESCR")) {
        std::string const text = RString("ERR_DESCR", key.c_str()).GetString().GetBufferReadPtr();
        for (size_t end = key.size();
             end > 1 && std::isdigit((unsigned char)key[end - 1]) && key[end - 2] == '_'; end -= 2)
            EXPECT_NE(text.find(std::string("%") + key[end - 1]), std::string::npos) << key;
    }
}

TEST_F(MessageTable, ConcatenationsGiveDynamicStrings) {
    RString const a("ERR_DESCR", "PATH_IS_EMPTY");
    RString const b("ERRORS", "NO_KEY", " (see log)");
    StaticString<64> const text("Note: ");
    EXPECT_STREQ((a + b).GetBufferReadPtr(), "Path is empty. (see log)");
    EXPECT_STREQ((text + a).GetBufferReadPtr(), "Note: Path is empty.");
    EXPECT_STREQ((a + text).GetBufferReadPtr(), "Path is empty.Note: ");
    EXPECT_STREQ((a + "!").GetBufferReadPtr(), "Path is empty.!");
    EXPECT_STREQ(("> " + a).GetBufferReadPtr(), "> Path is empty.");
    EXPECT_STREQ((a + L" wide").GetBufferReadPtr(), "Path is empty. wide");
    EXPECT_STREQ(a, "Path is empty."); // the operands are unchanged
}

TEST_F(MessageTable, ManyThreadsLookUpWhileRowsAreAdded) {
    std::atomic<int> mismatches{0};
    std::atomic<bool> stop{false};
    std::thread writer([&] {
        for (int i = 0; !stop; ++i)
            RString::SetString("LOAD", ("KEY" + std::to_string(i % 50)).c_str(), "loaded");
    });
    std::vector<std::thread> readers;
    for (int t = 0; t < 6; ++t)
        readers.emplace_back([&] {
            for (int i = 0; i < 3000; ++i) {
                RString const file("ERR_DESCR", "CANT_FIND_FILE");
                RString const missing("ERR_DESCR", "NOT_THERE", "default");
                if (std::strcmp(file, "Could not find file '%1'.") != 0 ||
                    std::strcmp(missing, "default") != 0)
                    ++mismatches;
            }
        });
    for (std::thread& reader : readers)
        reader.join();
    stop = true;
    writer.join();
    EXPECT_EQ(mismatches.load(), 0);
    EXPECT_STREQ(RString("LOAD", "KEY0"), "loaded");
}

TEST(LookupString, JoinsParentAndChildWithADot) {
    StaticString<64> const parent("Locals");
    DynamicString const child("Count", true);
    EXPECT_STREQ(AddLookupStrings("Locals", "Count").GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings(parent, "Count").GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings("Locals", child).GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings(parent, child).GetBufferReadPtr(), "Locals.Count");
}

TEST(LookupString, AnEmptyPartAddsNoSeparator) {
    EXPECT_STREQ(AddLookupStrings("", "Count").GetBufferReadPtr(), "Count");
    EXPECT_STREQ(AddLookupStrings("Locals", "").GetBufferReadPtr(), "Locals");
    EXPECT_STREQ(AddLookupStrings(nullptr, nullptr).GetBufferReadPtr(), "");

    DynamicString name;
    AppendToLookupString(name, "Step");
    AppendToLookupString(name, DynamicString("Result", true));
    AppendToLookupString(name, "");
    AppendToLookupString(name, nullptr);
    EXPECT_STREQ(name.GetBufferReadPtr(), "Step.Result");
}

TEST(LookupString, AppendingIntoFixedStorageTruncatesInsteadOfOverflowing) {
    StaticString<64> name("Parameters");
    AppendToLookupString(name, std::string(100, 'x').c_str());
    EXPECT_EQ(name.GetNumBytes(), 64);
    EXPECT_EQ(std::string(name.GetBufferReadPtr()).substr(0, 11), "Parameters.");
}

} // namespace
} // namespace tekit

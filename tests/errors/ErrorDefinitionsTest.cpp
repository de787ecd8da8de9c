// The enum, the error table and the "TE_ERRORS" message section are generated from one
// definition file; this checks that every row of it arrives in all three, in order.
#include "tekit/errors/RString.h"
#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <set>
#include <string>

using namespace tekit;

namespace {

struct Definition {
    TEError enumerator;
    std::int32_t value;
    char const* symbol;
    std::uint32_t comCode;
    char const* text;
};

constexpr Definition kDefinitions[] = {
#define TE_ERROR(symbol, value, comCode, text) {symbol, value, #symbol, comCode, text},
#include "tekit/errors/TEError.def"
};

} // namespace

TEST(ErrorDefinitions, EnumTableAndMessagesAgreeOnEveryRow) {
    TEErrorInfo const* table = GetTEErrorTable();
    std::set<std::string> symbols;
    std::size_t row = 0;
    for (Definition const& definition : kDefinitions) {
        SCOPED_TRACE(definition.symbol);
        EXPECT_EQ(definition.enumerator, definition.value);
        ASSERT_NE(table[row].symbol, nullptr) << "the table ends before the definitions";
        EXPECT_EQ(table[row].code, definition.value);
        EXPECT_STREQ(table[row].symbol, definition.symbol);
        EXPECT_EQ(table[row].comCode, definition.comCode);
        EXPECT_STREQ(TEErrorToStringSymbol(definition.enumerator), definition.symbol);
        bool found = false;
        RString message("TE_ERRORS", definition.symbol, "", &found);
        EXPECT_TRUE(found);
        EXPECT_STREQ(message.GetString().GetBufferReadPtr(), definition.text);
        if (row > 0) {
            EXPECT_LT(definition.value, kDefinitions[row - 1].value) << "rows out of order";
        }
        EXPECT_TRUE(symbols.insert(definition.symbol).second) << "symbol defined twice";
        ++row;
    }
    EXPECT_EQ(table[row].symbol, nullptr) << "the table has rows the definitions do not";
    EXPECT_EQ(row, 158u);
}

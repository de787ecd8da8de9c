// Fuzzes range-list parsing: a text either parses, and then its written form reads back to an
// equal list whose size, values and duplicates agree with each other, or raises
// TE_INVALID_OR_OUT_OF_RANGE with a message - never anything else.
//
// Input: one byte of options (bit 0 Shift-JIS multibyte mode), then the text (up to its first
// NUL).
#include "tekit/errors/TEException.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/toolbox/SimpleIntRangeList.h"

#include <climits>
#include <cstddef>
#include <cstdint>
#include <set>
#include <string>

using namespace tekit;

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// The values of a list with few of them, by iteration; checks each against its element.
std::multiset<int> Values(SimpleIntRangeList& list) {
    std::multiset<int> values;
    for (list.Reset(); !list.IsDone() && values.size() < 5000; ++list) {
        Check(list.Value() >= 0 && list.Value() <= SimpleIntRange::RANGE_MAX);
        values.insert(list.Value());
    }
    return values;
}

/// Size, iteration and duplicates agree for a list of at most a few thousand values.
void CheckSmallList(SimpleIntRangeList& list) {
    long long total = 0;
    for (int i = 0; i < list.GetNumRanges(); ++i)
        total += list.GetRange(i).GetSize();
    if (list.IsOpenEnded() || total > 5000)
        return;
    Check(list.GetSize() == total);
    std::multiset<int> const values = Values(list);
    Check(values.size() == size_t(total));
    bool const repeated = std::set<int>(values.begin(), values.end()).size() != values.size();
    Check(list.ContainsDuplicates() == repeated);
}

void CheckParsed(SimpleIntRangeList& list) {
    Check(list.GetNumRanges() >= 1);
    DynamicString const text = list.ToString();
    SimpleIntRangeList again;
    again.Parse(text); // must not raise
    Check(again == list);
    Check(again.ToString() == text);
    for (int i = 0; i + 1 < list.GetNumRanges(); ++i) {
        Check(!list.GetRange(i).IsOpenEnded());
        Check(list.GetRange(i).Overlaps(list.GetRange(i + 1)) ==
              list.GetRange(i + 1).Overlaps(list.GetRange(i)));
    }
    CheckSmallList(list);
    if (list.CloseTailIfOpenEnded(list.GetRange(list.GetNumRanges() - 1).GetStart() + 3))
        CheckSmallList(list);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
    if (size == 0)
        return 0;
    bool const multiByte = data[0] & 1;
    SetMultiByteCodePage(multiByte ? 932 : 0);
    String::EnableMultiByteSupport(multiByte);
    std::string const text(reinterpret_cast<char const*>(data + 1), size - 1);
    SimpleIntRangeList list;
    try {
        list.Parse(DynamicString(text.c_str()));
    } catch (TEException const& e) {
        Check(e.GetErrorCode() == TE_INVALID_OR_OUT_OF_RANGE);
        Check(e.GetDescription()[0] != '\0');
        return 0;
    }
    CheckParsed(list);
    return 0;
}

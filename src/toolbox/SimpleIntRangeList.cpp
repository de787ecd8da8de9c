// A range list: parsing, text, size, duplicates and iteration across its elements.
#include "tekit/toolbox/SimpleIntRangeList.h"

#include "tekit/errors/Raise.h"
#include "tekit/strings/StringVector.h"
#include "toolbox/IntRangeMessages.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <string>

namespace tekit {

void SimpleIntRangeList::Parse(String const& text) {
    Clear();
    StringVector elements;
    // Blank elements are skipped: "1,,3" is "1,3", and text without elements is everything.
    text.Split(elements, ",", true, true);
    if (elements.empty()) {
        if (std::strchr(text.GetBufferReadPtr(), ',') != nullptr)
            TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                     RangeMessage("ERR_RANGE_INVALID_RANGE_STRING_1", text.GetBufferReadPtr()),
                     "SimpleIntRangeList::Parse");
        m_ranges.push_back(SimpleIntRange::sAll);
    }
    DynamicString const* previous = nullptr;
    for (DynamicString const& element : elements) {
        AppendRangeElement(SimpleIntRange::ParseString(element), text,
                           previous ? *previous : element);
        previous = &element;
    }
    Reset();
}

void SimpleIntRangeList::AppendRangeElement(SimpleIntRange const& range, String const& wholeText,
                                            String const& previousElement) {
    if (IsOpenEnded())
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 RangeMessage("ERR_RANGE_OPEN_ENDED_MUST_BE_LAST_1_2", wholeText.GetBufferReadPtr(),
                              previousElement.GetBufferReadPtr()),
                 "SimpleIntRangeList::AppendRangeElement");
    m_ranges.push_back(range);
}

void SimpleIntRangeList::SetRange(SimpleIntRange const& range) {
    m_ranges.assign(1, range);
    Reset();
}

void SimpleIntRangeList::Clear() {
    m_ranges.clear();
    m_current = 0;
}

DynamicString SimpleIntRangeList::ToString() const {
    std::string text;
    for (SimpleIntRange const& range : m_ranges) {
        if (!text.empty())
            text += ',';
        text += range.ToString().GetBufferReadPtr();
    }
    return DynamicString(text.c_str());
}

int SimpleIntRangeList::GetSize() const {
    if (IsOpenEnded())
        return -1;
    long long total = 0;
    for (SimpleIntRange const& range : m_ranges)
        total += range.GetSize();
    if (total > INT_MAX)
        Throw32BitOverflowException("SimpleIntRangeList::GetSize", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    return static_cast<int>(total);
}

bool SimpleIntRangeList::ContainsDuplicates() const {
    // Sorted by their lowest value, two elements share a value exactly when one starts at or
    // below the highest value seen before it: n log n, not every pair.
    std::vector<std::pair<int, int>> spans;
    spans.reserve(m_ranges.size());
    for (SimpleIntRange const& range : m_ranges)
        spans.emplace_back(std::min(range.GetStart(), range.GetEnd()),
                           std::max(range.GetStart(), range.GetEnd()));
    std::sort(spans.begin(), spans.end());
    for (size_t i = 1; i < spans.size(); ++i) {
        if (spans[i].first <= spans[i - 1].second)
            return true;
        spans[i].second = std::max(spans[i].second, spans[i - 1].second);
    }
    return false;
}

bool SimpleIntRangeList::IsOpenEnded() const {
    return !m_ranges.empty() && m_ranges.back().IsOpenEnded();
}

bool SimpleIntRangeList::IsInOpenEndedTail() const {
    return m_current + 1 == m_ranges.size() && m_ranges.back().IsOpenEnded();
}

bool SimpleIntRangeList::CloseTailIfOpenEnded(int limit) {
    if (m_ranges.empty() || !m_ranges.back().CloseTailIfOpenEnded(limit))
        return false;
    SkipDoneRanges(); // the cursor may now lie past the new end
    return true;
}

void SimpleIntRangeList::Reset() {
    for (SimpleIntRange& range : m_ranges)
        range.Reset();
    m_current = 0;
}

int SimpleIntRangeList::Value() const {
    TE_ASSERT(!IsDone(), "SimpleIntRangeList::Value");
    return m_ranges[m_current].Value();
}

SimpleIntRangeList& SimpleIntRangeList::operator++() {
    if (IsDone())
        return *this;
    ++m_ranges[m_current];
    SkipDoneRanges();
    return *this;
}

void SimpleIntRangeList::SkipDoneRanges() {
    while (m_current < m_ranges.size() && m_ranges[m_current].IsDone())
        ++m_current;
}

} // namespace tekit

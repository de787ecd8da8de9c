// One element of a range list: parsing, text, size, overlap and iteration.
#include "tekit/toolbox/SimpleIntRange.h"

#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "toolbox/IntRangeMessages.h"

#include <algorithm>
#include <string>

namespace tekit {

constinit SimpleIntRange const SimpleIntRange::sAll(0, OPEN_ENDED_RANGE);

namespace {

bool IsBlank(String const& text) {
    for (char const* p = text.GetBufferReadPtr(); *p; ++p)
        if (*p != ' ' && (*p < '\t' || *p > '\r'))
            return false;
    return true;
}

/// The bytes [begin, end) of `text` as a string of their own.
DynamicString Part(String const& text, int begin, int end) {
    DynamicString part;
    part.AssignUsingNumBytesInsteadOfNumChars(text.GetBufferReadPtr() + begin, end - begin, false);
    return part;
}

} // namespace

SimpleIntRange SimpleIntRange::ParseString(String const& text) {
    if (IsBlank(text))
        return sAll;
    // A "-" is never the trail byte of a double-byte character, so bytes will do.
    std::string const bytes = text.GetBufferReadPtr();
    size_t const dash = bytes.find('-');
    if (dash == std::string::npos)
        return SimpleIntRange(ParseRangeIntHelper(text, text));
    // One "-" at most, with a value before it: "-3" (a sign) and "1-2-3" are no elements.
    if (bytes.find('-', dash + 1) != std::string::npos)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 RangeMessage("ERR_RANGE_INVALID_RANGE_STRING_1", text.GetBufferReadPtr()),
                 "SimpleIntRange::ParseString");
    int const start = ParseRangeIntHelper(Part(text, 0, int(dash)), text);
    DynamicString const rest = Part(text, int(dash) + 1, int(bytes.size()));
    if (IsBlank(rest))
        return SimpleIntRange(start, OPEN_ENDED_RANGE);
    return SimpleIntRange(start, ParseRangeIntHelper(rest, text));
}

int SimpleIntRange::ParseRangeIntHelper(String const& part, String const& element) {
    int value = 0;
    try {
        // The string family's reading: white space around, an optional sign, decimal digits.
        value = part.CvtToInt32();
    } catch (TEException const&) {
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 RangeMessage("ERR_RANGE_INVALID_RANGE_STRING_1", element.GetBufferReadPtr()),
                 "SimpleIntRange::ParseRangeIntHelper");
    }
    CheckRangeValue(value);
    return value;
}

void SimpleIntRange::CheckRangeValue(int value) {
    if (value >= 0 && value < OPEN_ENDED_RANGE)
        return;
    TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
             RangeMessage("ERR_RANGE_VALUE_OUT_OF_RANGE_1", std::to_string(value).c_str()),
             "SimpleIntRange::CheckRangeValue");
}

DynamicString SimpleIntRange::ToString() const {
    std::string text = std::to_string(m_start);
    if (IsOpenEnded())
        text += '-';
    else if (m_end != m_start)
        text += '-' + std::to_string(m_end);
    return DynamicString(text.c_str());
}

int SimpleIntRange::GetSize() const {
    if (IsOpenEnded())
        return -1;
    return (m_step > 0 ? m_end - m_start : m_start - m_end) + 1;
}

bool SimpleIntRange::Overlaps(SimpleIntRange const& other) const {
    // Each as low..high; an open-ended high (OPEN_ENDED_RANGE) lies above every value.
    int const low1 = std::min(m_start, m_end), high1 = std::max(m_start, m_end);
    int const low2 = std::min(other.m_start, other.m_end);
    int const high2 = std::max(other.m_start, other.m_end);
    return (low1 <= low2 && low2 <= high1) || (low2 <= low1 && low1 <= high2);
}

bool SimpleIntRange::CloseTailIfOpenEnded(int limit) {
    if (!IsOpenEnded())
        return false;
    // A limit past RANGE_MAX would leave the range open or beyond its values.
    m_end = std::max(m_start, std::min(limit, RANGE_MAX));
    return true;
}

bool SimpleIntRange::IsDone() const {
    if (m_step < 0)
        return m_current < m_end;
    return m_current > (IsOpenEnded() ? RANGE_MAX : m_end);
}

SimpleIntRange& SimpleIntRange::operator++() {
    if (!IsDone())
        m_current += m_step;
    return *this;
}

} // namespace tekit

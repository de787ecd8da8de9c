// One element of a range list: a single non-negative value, a run of values upward or
// downward, or an open-ended run from a value upward.
//
//   SimpleIntRange r = SimpleIntRange::ParseString(DynamicString("9-3"));   // 9, 8, ... 3
//   for (r.Reset(); !r.IsDone(); ++r)
//       Use(r.Value());
//
// Element syntax: a value ("3"), a range ("0-5", or "5-0" downward) or an open-ended range
// ("7-": 7 upward); white space may stand around each value and a value may carry a "+".
// Empty text (or only white space) is everything, sAll. Values run from 0 to RANGE_MAX.
// Parse failures raise TE_INVALID_OR_OUT_OF_RANGE with a message of the "ERR_DESCR" table.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

class TEKIT_API SimpleIntRange {
public:
    /// The end of a range that has none: it runs up to RANGE_MAX.
    static constexpr int OPEN_ENDED_RANGE = 0x7FFFFFFE;
    /// The largest value a range may hold.
    static constexpr int RANGE_MAX = 0x7FFFFFFD;
    /// Everything: 0 upward, open-ended.
    static SimpleIntRange const sAll;

    /// Everything, as sAll: what an empty element means.
    constexpr SimpleIntRange() : SimpleIntRange(0, OPEN_ENDED_RANGE) {}
    /// The single value `value`.
    constexpr explicit SimpleIntRange(int value) : SimpleIntRange(value, value) {}
    /// `start` to `end`, downward when `end` is below `start`; `end` may be OPEN_ENDED_RANGE.
    /// A value outside 0..RANGE_MAX raises TE_INVALID_OR_OUT_OF_RANGE.
    constexpr SimpleIntRange(int start, int end)
        : m_start(Checked(start)), m_end(end == OPEN_ENDED_RANGE ? end : Checked(end)),
          m_step(start <= end ? 1 : -1), m_current(start) {}

    /// One element (syntax above).
    static SimpleIntRange ParseString(String const& text);
    /// "3", "0-5", "5-0" or "7-": text that ParseString reads back to an equal range.
    DynamicString ToString() const;

    /// The number of values; -1 when open-ended.
    int GetSize() const;
    bool IsOpenEnded() const { return m_end == OPEN_ENDED_RANGE; }
    /// Whether the two share a value (an open-ended range reaches every value above its start).
    bool Overlaps(SimpleIntRange const& other) const;
    /// Gives an open-ended range the end max(start, limit), with limit taken as at most
    /// RANGE_MAX, and returns true; false, and nothing changed, for a range with an end.
    bool CloseTailIfOpenEnded(int limit);

    int GetStart() const { return m_start; }
    /// The last value, or OPEN_ENDED_RANGE.
    int GetEnd() const { return m_end; }
    /// +1 upward, -1 downward.
    int GetStep() const { return m_step; }

    // Iteration: from start, one step at a time, until the cursor has passed the end (for an
    // open-ended range, RANGE_MAX).
    void Reset() { m_current = m_start; }
    bool IsDone() const;
    /// The cursor's value (meaningful while not done).
    int Value() const { return m_current; }
    SimpleIntRange& operator++();

    /// Same start and end; the cursor is not compared.
    bool operator==(SimpleIntRange const& other) const {
        return m_start == other.m_start && m_end == other.m_end;
    }

private:
    /// `value` when it lies in 0..RANGE_MAX; raises otherwise.
    static constexpr int Checked(int value) {
        if (value < 0 || value > RANGE_MAX)
            CheckRangeValue(value);
        return value;
    }
    /// The value of one side of `element`; raises naming `element` when `part` is not one
    /// whole 32-bit integer, or when the value is out of range.
    static int ParseRangeIntHelper(String const& part, String const& element);
    /// Raises TE_INVALID_OR_OUT_OF_RANGE unless 0 <= value < OPEN_ENDED_RANGE.
    static void CheckRangeValue(int value);

    int m_start;
    int m_end;
    int m_step;
    int m_current;
};

} // namespace tekit

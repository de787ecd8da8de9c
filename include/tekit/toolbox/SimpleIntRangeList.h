// A range list: a user's selection of non-negative integers such as element indices, written
// as comma-separated range elements ("0-3, 7, 12-10, 20-").
//
//   SimpleIntRangeList list;
//   list.Parse(DynamicString("1-3,7-"));
//   list.CloseTailIfOpenEnded(numElements - 1);
//   for (list.Reset(); !list.IsDone(); ++list)
//       Use(list.Value());                      // 1 2 3 7 8 ... numElements - 1
//
// List syntax: elements (see SimpleIntRange.h) separated by commas. Elements that are empty or
// only white space are skipped, so "1,,3" is "1,3"; a text without any element is everything
// (sAll), unless it holds a comma (",") - that is an error. Only the last element may be
// open-ended. ToString writes the elements joined by "," with no spaces ("1-3,7-"), which
// Parse reads back to an equal list.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/SimpleIntRange.h"

#include <vector>

namespace tekit {

class TEKIT_API SimpleIntRangeList {
public:
    /// The empty list (no values), which Parse or SetRange fills.
    SimpleIntRangeList() = default;

    /// Replaces the list by the elements of `text` and resets the iteration. A failure raises
    /// TE_INVALID_OR_OUT_OF_RANGE and leaves the elements parsed before it.
    void Parse(String const& text);
    /// Appends `range`; raises when the list already ends open-ended, naming `wholeText` and
    /// `previousElement`, the open-ended element's text.
    void AppendRangeElement(SimpleIntRange const& range, String const& wholeText,
                            String const& previousElement);
    /// The list holds `range` alone.
    void SetRange(SimpleIntRange const& range);
    void Clear();
    /// The elements joined by ","; the empty list gives "" (which reads back as everything).
    DynamicString ToString() const;

    /// The number of values; -1 when open-ended. A total above 2147483647 raises
    /// TE_INT32_OVERFLOW.
    int GetSize() const;
    /// Whether some value belongs to two elements ("1-5,3" or "2,2").
    bool ContainsDuplicates() const;
    bool IsOpenEnded() const;
    /// Whether the iteration is in the last element and that element is open-ended.
    bool IsInOpenEndedTail() const;
    /// Closes an open-ended last element at max(its start, limit) (SimpleIntRange's rule);
    /// false when the list does not end open-ended.
    bool CloseTailIfOpenEnded(int limit);

    int GetNumRanges() const { return static_cast<int>(m_ranges.size()); }
    SimpleIntRange const& GetRange(int index) const { return m_ranges[std::size_t(index)]; }

    // Iteration over every value, element by element in order.
    void Reset();
    bool IsDone() const { return m_current >= m_ranges.size(); }
    /// The current value; raises TE_PROGRAM_ERROR once done.
    int Value() const;
    SimpleIntRangeList& operator++();

    /// Same elements in the same order; the iteration is not compared.
    bool operator==(SimpleIntRangeList const& other) const { return m_ranges == other.m_ranges; }

private:
    /// Moves the iteration past elements that are done.
    void SkipDoneRanges();

    std::vector<SimpleIntRange> m_ranges;
    /// The element being iterated; m_ranges.size() once done.
    std::size_t m_current = 0;
};

} // namespace tekit

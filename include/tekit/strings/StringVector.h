// StringVector: an ordered list of DynamicString, the library's list of texts.
//
//   StringVector keys;
//   RString::GetSectionTags("ERR_DESCR", keys);
//   for (DynamicString const& key : keys) ...
//
// It converts to and from comma-separated text (with any single-byte delimiter other than the
// double quote) and, on Windows, COM SAFEARRAYs of BSTR:
//
//   StringVector items;
//   items.SetFromCSVString(DynamicString("a,\"b,c\",", true));   // a | b,c | (empty)
//   DynamicString csv;
//   items.CreateCSVString(csv);                                  // a,"b,c",
//
// Comma-separated text follows the common rules:
//   - items are separated by the delimiter; an empty text has no items, "a," has two;
//   - an item that holds the delimiter, a double quote, a carriage return or a line feed is
//     written in double quotes, its double quotes doubled; a lone empty item is written ""
//     so that it is told apart from no item at all;
//   - reading, a double quote opens a quoted item only as an item's first character; text
//     after its closing quote, up to the delimiter, is kept as written; a double quote inside
//     an unquoted item is an ordinary character; a quoted item without its closing quote
//     raises TE_UNRECOGNIZED_VALUE.
// A double quote as the delimiter raises TE_INVALID_OR_OUT_OF_RANGE; a NUL delimiter means
// the comma. In multibyte mode the delimiter is found only as a character of its own, never
// as the trail byte of a double-byte character (so text must be well formed in its code page:
// a dangling lead byte at an item's end would swallow the delimiter after it).
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <vector>

namespace tekit {

class TEKIT_API StringVector : public std::vector<DynamicString> {
public:
    using std::vector<DynamicString>::vector;
    StringVector() = default;

    /// Writes the items as one comma-separated text into `csv`.
    void CreateCSVString(String& csv, char delimiter = ',') const;
    /// Replaces the items by those of the comma-separated text `csv`.
    void SetFromCSVString(String const& csv, char delimiter = ',');

    /// The items joined with `separator` (null: none) between them.
    void Join(String& result, char const* separator) const;
    /// Index of the first item equal to `text`, or -1.
    int Find(char const* text, bool ignoreCase = false) const;

#if TEKIT_HAS_OLE
    /// A new one-dimensional SAFEARRAY of BSTR (lower bound 0) holding the items; the caller
    /// destroys it with SafeArrayDestroy.
    void CreateSafeArray(SAFEARRAY** array) const;
    /// Replaces the items by the strings of a one-dimensional SAFEARRAY of BSTR (null BSTRs
    /// are empty); another element type or dimension raises TE_TYPE_MISMATCH_ERROR. A null
    /// array leaves no items.
    void SetFromSafeArray(SAFEARRAY* array);
#endif
};

} // namespace tekit

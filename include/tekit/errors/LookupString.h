// Lookup strings: the names by which the product addresses a property, "Parent.Child".
//
//   DynamicString name = AddLookupStrings("Locals", "Count");   // "Locals.Count"
//   AppendToLookupString(name, "Value");                         // "Locals.Count.Value"
//
// The two parts are joined with "."; when either part is empty no separator is added, so
// building a name from an empty root gives the child alone.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

/// The separator between the parts of a lookup string.
inline constexpr char kLookupStringSeparator[] = ".";

TEKIT_API DynamicString AddLookupStrings(char const* parent, char const* child);
TEKIT_API DynamicString AddLookupStrings(String const& parent, char const* child);
TEKIT_API DynamicString AddLookupStrings(char const* parent, String const& child);
TEKIT_API DynamicString AddLookupStrings(String const& parent, String const& child);
#if TEKIT_HAS_OLE
TEKIT_API _bstr_t AddLookupStrings(_bstr_t const& parent, _bstr_t const& child);
#endif

/// Appends "." (when both are non-empty) and `child` to `lookup`.
TEKIT_API void AppendToLookupString(String& lookup, char const* child);
TEKIT_API void AppendToLookupString(String& lookup, String const& child);

} // namespace tekit

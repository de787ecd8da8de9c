// Lookup strings: property names joined with ".".
#include "tekit/errors/LookupString.h"

namespace tekit {

void AppendToLookupString(String& lookup, char const* child) {
    if (!child || !*child)
        return;
    if (!lookup.IsEmpty())
        lookup += kLookupStringSeparator;
    lookup += child;
}

void AppendToLookupString(String& lookup, String const& child) {
    if (child.IsEmpty())
        return;
    if (!lookup.IsEmpty())
        lookup += kLookupStringSeparator;
    lookup += child;
}

DynamicString AddLookupStrings(char const* parent, char const* child) {
    DynamicString lookup(parent ? parent : "");
    AppendToLookupString(lookup, child);
    return lookup;
}

DynamicString AddLookupStrings(String const& parent, char const* child) {
    DynamicString lookup(parent);
    AppendToLookupString(lookup, child);
    return lookup;
}

DynamicString AddLookupStrings(char const* parent, String const& child) {
    DynamicString lookup(parent ? parent : "");
    AppendToLookupString(lookup, child);
    return lookup;
}

DynamicString AddLookupStrings(String const& parent, String const& child) {
    DynamicString lookup(parent);
    AppendToLookupString(lookup, child);
    return lookup;
}

} // namespace tekit

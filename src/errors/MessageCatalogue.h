// The library's built-in English messages: the rows the global message table starts with.
#pragma once

namespace tekit::detail {

struct MessageRow {
    char const* key;
    char const* text;
};

struct MessageSection {
    char const* name;
    MessageRow const* rows;
    int numRows;
};

/// The built-in sections, "ERRORS" first, ended by a section whose name is null.
MessageSection const* GetBuiltInMessageSections();

} // namespace tekit::detail

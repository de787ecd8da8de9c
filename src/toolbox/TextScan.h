// Character stepping and white space shared by the toolbox's text helpers, in the string
// family's single-byte or multibyte mode.
#pragma once

namespace tekit::toolbox {

/// The "C" locale's white space: space, tab, line feed, vertical tab, form feed, return.
inline bool IsWhiteSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

/// The character after the one at `p` (which is not the terminator): two bytes on for a
/// double-byte character in multibyte mode.
char const* NextChar(char const* p);
inline char* NextChar(char* p) {
    return const_cast<char*>(NextChar(static_cast<char const*>(p)));
}

/// First character that is not white space.
char const* SkipWhite(char const* p);
/// The end of `text` without its trailing white space (just after its last other character).
char const* TrimmedEnd(char const* text);

/// The number of bytes, at most `limit`, that a cut of `text` (whose length is `length`) may
/// keep without splitting a character.
int CutAtCharBoundary(char const* text, int length, int limit);

/// Compares two byte ranges ignoring ASCII case, character by character: -1, 0 or 1.
int CompareIgnoringCase(char const* a, char const* aEnd, char const* b, char const* bEnd);

} // namespace tekit::toolbox

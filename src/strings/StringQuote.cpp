// Quoted literals: double quotes around text whose quotes and backslashes are escaped.
#include "strings/CharScan.h"
#include "tekit/strings/String.h"

#include <string>

namespace tekit {

void String::Quote() {
    std::string out;
    out.reserve(static_cast<size_t>(GetNumBytes()) + 2);
    out += '"';
    out += GetBufferReadPtr();
    out += '"';
    detail::AssignResult(*this, out);
}

void String::EscapeQuotes() {
    static char const* kReplacements[] = {"\\\"", "\\\\"};
    EscapeCharsHelper(*this, "\"\\", kReplacements);
}

void String::EscapeQuotesAndQuote() {
    EscapeQuotes();
    Quote();
}

void String::EscapeAndQuote() {
    EscapeSpecialChars(false);
    Quote();
}

bool String::IsSurroundedByQuotes() const {
    char const* text = GetBufferReadPtr();
    int const numBytes = GetNumBytes();
    if (numBytes < 2 || text[0] != '"')
        return false;
    int closing = 1;
    return FindNextUnescapedQuoteChar(text, &closing, nullptr) && closing == numBytes - 1;
}

bool String::RemoveSurroundingQuotes() {
    if (!IsSurroundedByQuotes())
        return false;
    std::string inner(GetBufferReadPtr() + 1, static_cast<size_t>(GetNumBytes() - 2));
    detail::AssignResult(*this, inner);
    return true;
}

bool String::RemoveQuotesAndUnescape() {
    if (!RemoveSurroundingQuotes())
        return false;
    UnescapeSpecialChars(false);
    return true;
}

} // namespace tekit

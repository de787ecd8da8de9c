// Editing a string in place: sub-strings, replacement, truncation, trimming, appending with a
// separator, and the fallback for a placeholder that formatting could not find.
//
// Every member leaves the string untouched (no write pointer taken, so a shared block is not
// copied) when it changes nothing, takes its text arguments aside when they point into the
// string itself, and keeps the cached size exact.
#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"
#include "strings/TextEdit.h"
#include "strings/TextSearch.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"

#include <climits>
#include <cstring>
#include <string>

namespace tekit {

namespace {

int Length(char const* text) {
    return text ? static_cast<int>(std::strlen(text)) : 0;
}

/// Bytes of `numChars` characters from byte `offset` (negative count: to the end).
int BytesOfChars(char const* text, int textBytes, int offset, int numChars, bool mb) {
    if (numChars < 0)
        return textBytes - offset;
    if (mb)
        return mbcs::NBCnt(text + offset, numChars);
    return std::min(numChars, textBytes - offset);
}

} // namespace

// ---- Sub-strings ------------------------------------------------------------------------

void String::GetSubstring(int start, int numChars, String& out) const {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int const offset = detail::OffsetOfChar(text, numBytes, start, mb);
    int const bytes = BytesOfChars(text, numBytes, offset, numChars, mb);
    if (&out == this && offset == 0 && bytes == numBytes)
        return;
    // The assignment copies the bytes aside itself when `out` is this string.
    out.AssignUsingNumBytesInsteadOfNumChars(text + offset, bytes, false);
}

namespace {

/// Inserts `insert` before character `charIndex` of `s`: the new byte size, or -1 when there
/// is nothing to insert.
int InsertBeforeChar(String& s, detail::StableText const& insert, int charIndex, bool mb) {
    if (insert.size() == 0)
        return -1;
    int const numBytes = s.GetNumBytes();
    int const offset = detail::OffsetOfChar(detail::ReadPtr(s), numBytes, charIndex, mb);
    return detail::InsertBytes(s, numBytes, offset, insert.data(), insert.size());
}

} // namespace

void String::InsertSubstring(char const* text, int charIndex) {
    int const size = InsertBeforeChar(*this, detail::StableText(*this, text, -1), charIndex,
                                      m_isMultiByteSupportEnabled);
    if (size >= 0)
        SetCachedSize(size);
}

void String::InsertSubstring(String const& text, int charIndex) {
    detail::StableText const insert(*this, detail::ReadPtr(text), text.GetNumBytes());
    int const size = InsertBeforeChar(*this, insert, charIndex, m_isMultiByteSupportEnabled);
    if (size >= 0)
        SetCachedSize(size);
}

void String::RemoveSubstring(int start, int numChars) {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int const offset = detail::OffsetOfChar(text, numBytes, start, mb);
    int const bytes = BytesOfChars(text, numBytes, offset, numChars, mb);
    if (bytes == 0)
        return;
    if (bytes == numBytes) {
        Clear(); // a shared block is released rather than copied
        return;
    }
    SetCachedSize(detail::RemoveBytes(*this, numBytes, offset, bytes));
}

void String::ReplaceSubstring(int start, int numChars, char const* replacement) {
    bool const mb = m_isMultiByteSupportEnabled;
    detail::StableText const insert(*this, replacement, -1);
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int const offset = detail::OffsetOfChar(text, numBytes, start, mb);
    int const bytes = BytesOfChars(text, numBytes, offset, numChars, mb);
    detail::Replace(*this, numBytes, offset, bytes, insert,
                    [this](int size) { SetCachedSize(size); });
}

bool String::ReplaceSubstring(String const& find, String const& replacement, bool ignoreCase,
                              bool wholeWordOnly) {
    return ReplaceSubstring(detail::ReadPtr(find), detail::ReadPtr(replacement), ignoreCase,
                            wholeWordOnly);
}

bool String::ReplaceSubstring(char const* find, char const* replacement, bool ignoreCase,
                              bool wholeWordOnly) {
    bool const mb = m_isMultiByteSupportEnabled;
    int const numBytes = GetNumBytes();
    detail::Needle const needle{find, Length(find), ignoreCase, wholeWordOnly};
    int const at = detail::FindNext(detail::ReadPtr(*this), numBytes, 0, needle, mb);
    if (at < 0)
        return false;
    detail::StableText const insert(*this, replacement, -1);
    detail::Replace(*this, numBytes, at, needle.bytes, insert,
                    [this](int size) { SetCachedSize(size); });
    return true;
}

// The result is built aside in one pass, so the cost is linear in the text whatever the
// number of replacements, and a replacement is never searched again.
int String::ReplaceAllSubstrings(char const* find, char const* replacement, bool ignoreCase,
                                 bool wholeWordOnly) {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    detail::Needle const needle{find, Length(find), ignoreCase, wholeWordOnly};
    int at = detail::FindNext(text, numBytes, 0, needle, mb);
    if (at < 0)
        return 0;
    std::string const insert(replacement ? replacement : "");
    std::string result;
    result.reserve(size_t(numBytes));
    int count = 0;
    int copied = 0;
    for (; at >= 0; at = detail::FindNext(text, numBytes, copied, needle, mb)) {
        result.append(text + copied, size_t(at - copied));
        result += insert;
        copied = at + needle.bytes;
        ++count;
    }
    result.append(text + copied, size_t(numBytes - copied));
    if (result.size() > size_t(INT_MAX) - 16)
        Throw32BitOverflowException("String::ReplaceAllSubstrings", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    AssignUsingNumBytesInsteadOfNumChars(result.c_str(), static_cast<int>(result.size()), false);
    return count;
}

bool String::ReplaceIfEqual(char const* text, char const* replacement, bool ignoreCase) {
    if (Compare(text ? text : "", ignoreCase) != 0)
        return false;
    if (std::strcmp(detail::ReadPtr(*this), replacement ? replacement : "") != 0)
        Assign(replacement ? replacement : "");
    return true;
}

void String::TruncateToNChars(int numChars, char const* suffix) {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int const cut = detail::OffsetOfChar(text, numBytes, numChars, mb);
    if (cut >= numBytes)
        return;
    detail::StableText const tail(*this, suffix, -1);
    int const suffixChars = mb ? mbcs::Len(tail.data()) : tail.size();
    int const keepChars = std::max(numChars, 0) - suffixChars;
    if (tail.size() > 0 && keepChars >= 0) {
        int const keep = detail::OffsetOfChar(text, numBytes, keepChars, mb);
        detail::Splice(*this, numBytes, keep, numBytes - keep, tail,
                       [this](int size) { SetCachedSize(size); });
    } else if (cut == 0) {
        Clear();
    } else {
        SetCachedSize(detail::CutAt(*this, cut));
    }
}

// ---- Trimming ---------------------------------------------------------------------------

void String::TrimLeft(char const* set) {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    char const* p = text;
    while (*p && detail::IsInSet(detail::CharAt(p, mb), set, mb))
        p += detail::CharBytes(p, mb);
    int const skipped = static_cast<int>(p - text);
    if (skipped == 0)
        return;
    if (skipped == numBytes)
        Clear();
    else
        SetCachedSize(detail::RemoveBytes(*this, numBytes, 0, skipped));
}

void String::TrimRight(char const* set) {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    int end = 0;
    if (!mb) {
        for (end = numBytes; end > 0; --end)
            if (!detail::IsInSet(static_cast<unsigned char>(text[end - 1]), set, false))
                break;
    } else {
        // Forward: the end of the last character outside the set.
        for (char const* p = text; *p;) {
            int const width = detail::CharBytes(p, true);
            if (!detail::IsInSet(detail::CharAt(p, true), set, true))
                end = static_cast<int>(p - text) + width;
            p += width;
        }
    }
    if (end == numBytes)
        return;
    if (end == 0)
        Clear();
    else
        SetCachedSize(detail::CutAt(*this, end));
}

void String::RemoveSurroundingWhiteSpace(TrimOptions options) {
    // The right end first, so the left trim moves fewer bytes.
    if (options & kTrimRight)
        TrimRight(nullptr);
    if (options & kTrimLeft)
        TrimLeft(nullptr);
}

// ---- Appending with a separator ----------------------------------------------------------

void String::Append(String const& item, char const* separator) {
    int const itemBytes = item.GetNumBytes();
    if (separator && *separator && !IsEmpty())
        AppendBytes(separator, -1);
    // Read after the separator went in: when `item` is this string its text is still the first
    // itemBytes bytes, and AppendBytes copies them aside before writing.
    AppendBytes(detail::ReadPtr(item), itemBytes);
}

void String::AppendUsingSeparator(String const& item, char const* separator) {
    int const itemBytes = item.GetNumBytes();
    int skip = 0;
    if (separator && *separator && !IsEmpty()) {
        bool const textEnds = EndsWith(separator);
        bool const itemStarts = item.StartsWith(separator);
        if (textEnds && itemStarts)
            skip = Length(separator); // both carry it: keep one
        else if (!textEnds && !itemStarts)
            AppendBytes(separator, -1);
    }
    AppendBytes(detail::ReadPtr(item) + skip, itemBytes - skip);
}

// ---- Formatting fallback -----------------------------------------------------------------

void String::HandleMissingFormatArgument(String const& placeholder, String const& argument) {
    TE_WARN(RString("ERR_DESCR", "FORMAT_ARGUMENT_NOT_FOUND", nullptr, nullptr),
            "String::HandleMissingFormatArgument");
    std::string tail(" COULD NOT FIND ");
    tail.append(detail::ReadPtr(placeholder), size_t(placeholder.GetNumBytes()));
    tail += "TO REPLACE WITH ";
    tail.append(detail::ReadPtr(argument), size_t(argument.GetNumBytes()));
    tail += ' ';
    AppendBytes(tail.c_str(), static_cast<int>(tail.size()));
}

} // namespace tekit

// Case and shape: ASCII case changes, reversing by characters, repeating.
//
// Case changes are locale independent on purpose: identifiers, keywords and file extensions
// must compare the same on every user's machine, so only 'A'-'Z' and 'a'-'z' change; bytes
// above 127 and double-byte characters (whose trail byte may look like an ASCII letter) are
// left alone.
#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"
#include "strings/TextSearch.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <utility>

namespace tekit {

namespace {

bool ChangesCase(unsigned short ch, bool upper) {
    return upper ? (ch >= 'a' && ch <= 'z') : (ch >= 'A' && ch <= 'Z');
}

/// The byte range [first, end) of `numChars` characters from `start`, narrowed to begin at the
/// first character whose case changes, and the number of characters left from there (negative:
/// all). `first` equals `end` when nothing changes.
struct CaseRange {
    int first;
    int end;
    int numChars;
};

CaseRange FindCaseRange(String const& s, int start, int numChars, bool upper, bool mb) {
    char const* text = detail::ReadPtr(s);
    int const numBytes = s.GetNumBytes();
    int first = detail::OffsetOfChar(text, numBytes, start, mb);
    int end = numBytes;
    if (numChars >= 0)
        end = first +
              (mb ? mbcs::NBCnt(text + first, numChars) : std::min(numChars, numBytes - first));
    for (; first < end && !ChangesCase(detail::CharAt(text + first, mb), upper); --numChars)
        first += detail::CharBytes(text + first, mb);
    return {first, end, numChars};
}

/// Folds the single-byte characters of [first, end) of a writable text.
void FoldBytes(char* p, CaseRange const& range, bool upper) {
    for (int i = range.first; i < range.end; ++i) {
        auto const ch = static_cast<unsigned char>(p[i]);
        p[i] = static_cast<char>(upper ? mbcs::ToUpper(ch) : mbcs::ToLower(ch));
    }
}

/// Folds `numChars` characters from character `start` of `s` to upper or lower case; returns
/// the text's byte count, which folding keeps, or -1 when no character changes (the text is
/// then left alone).
int FoldCase(String& s, int start, int numChars, bool upper, bool mb) {
    CaseRange const range = FindCaseRange(s, start, numChars, upper, mb);
    if (range.first >= range.end)
        return -1;
    int const numBytes = s.GetNumBytes();
    char* p = s.GetBufferWritePtr();
    if (!mb)
        FoldBytes(p, range, upper);
    else if (upper)
        String::MBCSUpperN(p + range.first, range.numChars);
    else
        String::MBCSLowerN(p + range.first, range.numChars);
    return numBytes;
}

} // namespace

void String::SetUppercase() {
    SetUppercase(0, -1);
}

void String::SetLowercase() {
    SetLowercase(0, -1);
}

void String::SetUppercase(int start, int numChars) {
    int const numBytes = FoldCase(*this, start, numChars, true, m_isMultiByteSupportEnabled);
    if (numBytes >= 0)
        SetCachedSize(numBytes + 1);
}

void String::SetLowercase(int start, int numChars) {
    int const numBytes = FoldCase(*this, start, numChars, false, m_isMultiByteSupportEnabled);
    if (numBytes >= 0)
        SetCachedSize(numBytes + 1);
}

// In place: each double-byte character is first stored trail byte first, so reversing all
// the bytes afterwards restores its order while the characters themselves are reversed.
void String::Reverse() {
    bool const mb = m_isMultiByteSupportEnabled;
    int const numBytes = GetNumBytes();
    if (numBytes < 2 || (mb && mbcs::CharBytes(detail::ReadPtr(*this)) == numBytes))
        return;
    char* p = GetBufferWritePtr();
    for (int i = 0; mb && i < numBytes;) {
        int const width = mbcs::CharBytes(p + i);
        if (width == 2)
            std::swap(p[i], p[i + 1]);
        i += std::max(width, 1);
    }
    std::reverse(p, p + numBytes);
    SetCachedSize(numBytes + 1);
}

// The copies are made by doubling what is already written, so n copies take log n copies.
void String::Repeat(int count) {
    int const numBytes = GetNumBytes();
    if (count <= 0) {
        if (numBytes > 0)
            Clear();
        return;
    }
    if (count == 1 || numBytes == 0)
        return;
    long long const total = static_cast<long long>(numBytes) * count;
    if (total >= INT_MAX)
        Throw32BitOverflowException("String::Repeat", TE_FILE_BASE_NAME, __LINE__, true);
    int const available = RequestBufferSize(static_cast<int>(total) + 1, true, false);
    if (available <= numBytes + 1)
        return; // storage that cannot grow is already full
    int length = std::min(static_cast<int>(total), available - 1);
    char* p = GetBufferWritePtr();
    if (length < total && m_isMultiByteSupportEnabled) {
        // The cut falls inside the last, partial copy: end it on a character boundary.
        int const partial = length % numBytes;
        length += SizeOfMBCSSubString(p, -1, partial) - partial;
    }
    for (int filled = numBytes; filled < length;) {
        int const chunk = std::min(filled, length - filled);
        std::memcpy(p + filled, p, size_t(chunk));
        filled += chunk;
    }
    p[length] = '\0';
    SetCachedSize(length + 1);
}

} // namespace tekit

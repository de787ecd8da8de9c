// Byte-level helpers shared by the whole string family: bounded copies, insertion, removal,
// case changes and character positions. The MBCS forms always follow the lead-byte table;
// with no lead bytes they behave as the byte forms. None reads past a terminator or writes
// outside `destSize` bytes, and a null text is the empty text.
#include "strings/MultiByteChars.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <cstring>
#include <string>

namespace tekit {

namespace {

int Length(char const* s) {
    return s ? static_cast<int>(std::strlen(s)) : 0;
}

/// Bytes of the longest prefix of `s` within `maxBytes` bytes that ends on a character boundary.
int MBCSPrefixBytes(char const* s, int maxBytes) {
    return String::SizeOfMBCSSubString(s, -1, maxBytes);
}

/// Shared body of the insertions: `cut(text, room)` says how many bytes of a text fit.
template <class Cut> void Insert(char* dest, char const* text, int offset, int destSize, Cut cut) {
    if (!dest || destSize < 1)
        return;
    int const length = static_cast<int>(strnlen(dest, size_t(destSize - 1)));
    dest[length] = '\0'; // a text that filled the whole buffer is cut to leave the terminator
    offset = std::clamp(offset, 0, length);
    std::string const insert(text ? text : ""); // the text may lie inside dest
    int const room = destSize - 1 - offset;
    int const keepText = cut(insert.c_str(), room);
    // When the text itself is cut, none of the old tail follows it: the result stays a prefix of
    // the uncut result.
    int const keepTail = keepText < int(insert.size()) ? 0 : cut(dest + offset, room - keepText);
    std::memmove(dest + offset + keepText, dest + offset, size_t(keepTail));
    std::memcpy(dest + offset, insert.data(), size_t(keepText));
    dest[offset + keepText + keepTail] = '\0';
}

/// The most bytes a bounded copy may take: destSize - 1, and at most `numBytes` when that is
/// not negative; -1, with the cached size 0, when there is no room at all.
int CopyLimit(char const* dest, int numBytes, int destSize, int* cachedSize) {
    if (!dest || destSize < 1) {
        if (cachedSize)
            *cachedSize = 0;
        return -1;
    }
    return numBytes >= 0 ? std::min(destSize - 1, numBytes) : destSize - 1;
}

} // namespace

void String::StringCopyMax(char* dest, char const* src, int destSize, int* cachedSize) {
    StringCopyMaxN(dest, src, -1, destSize, cachedSize);
}

void String::StringCopyMaxN(char* dest, char const* src, int numBytes, int destSize,
                            int* cachedSize) {
    int const limit = CopyLimit(dest, numBytes, destSize, cachedSize);
    if (limit < 0)
        return;
    int const n = src ? static_cast<int>(strnlen(src, size_t(limit))) : 0;
    if (n > 0)
        std::memmove(dest, src, size_t(n));
    dest[n] = '\0';
    if (cachedSize)
        *cachedSize = n + 1;
}

void String::MBCSStringCopyMax(char* dest, char const* src, int destSize, int* cachedSize) {
    MBCSStringCopyMaxN(dest, src, -1, destSize, cachedSize);
}

// The count is the longest prefix of at most `numBytes` bytes (negative: all) that fits in
// destSize - 1 bytes without splitting a double-byte character.
void String::MBCSStringCopyMaxN(char* dest, char const* src, int numBytes, int destSize,
                                int* cachedSize) {
    int const limit = CopyLimit(dest, numBytes, destSize, cachedSize);
    if (limit < 0)
        return;
    StringCopyMaxN(dest, src, MBCSPrefixBytes(src, limit), destSize, cachedSize);
}

void String::MBSafeStringCopyMax(char* dest, char const* src, int destSize, int* cachedSize) {
    if (m_isMultiByteSupportEnabled)
        MBCSStringCopyMax(dest, src, destSize, cachedSize);
    else
        StringCopyMax(dest, src, destSize, cachedSize);
}

int String::SizeOfMBCSSubString(char const* text, int numChars, int maxBytes) {
    int bytes = 0;
    for (int chars = 0;
         text && bytes < maxBytes && text[bytes] != '\0' && (numChars < 0 || chars < numChars);
         ++chars) {
        int const width = mbcs::CharBytes(text + bytes);
        if (bytes + width > maxBytes)
            break;
        bytes += width;
    }
    return bytes;
}

void String::StringInsert(char* dest, char const* text, int offset, int destSize) {
    Insert(dest, text, offset, destSize,
           [](char const* s, int room) { return std::max(0, std::min(Length(s), room)); });
}

// The offset is snapped back to the start of the character it falls in, and what does not fit
// is cut on a character boundary.
void String::MBCSStringInsert(char* dest, char const* text, int offset, int destSize) {
    if (dest && destSize >= 1 && offset > 0) {
        int const length = static_cast<int>(strnlen(dest, size_t(destSize - 1)));
        offset = std::min(offset, length);
        offset = mbcs::NBCnt(dest, mbcs::CharsInBytes(dest, offset));
    }
    Insert(dest, text, offset, destSize,
           [](char const* s, int room) { return MBCSPrefixBytes(s, std::max(room, 0)); });
}

void String::StringRemove(char* dest, int offset, int numBytes) {
    int const length = Length(dest);
    if (length == 0 || numBytes <= 0 || offset < 0 || offset >= length)
        return;
    numBytes = std::min(numBytes, length - offset);
    std::memmove(dest + offset, dest + offset + numBytes, size_t(length - offset - numBytes + 1));
}

void String::MBCSStringRemove(char* dest, int charIndex, int numChars) {
    if (!dest || charIndex < 0 || numChars <= 0)
        return;
    int const offset = mbcs::NBCnt(dest, charIndex);
    int const numBytes = mbcs::NBCnt(dest + offset, numChars);
    StringRemove(dest, offset, numBytes);
}

void String::MBCSUpperN(char* text, int numChars) {
    for (char* p = text; p && *p != '\0' && numChars != 0; p = mbcs::Inc(p), --numChars)
        if (mbcs::CharBytes(p) == 1)
            *p = static_cast<char>(mbcs::ToUpper(static_cast<unsigned char>(*p)));
}

void String::MBCSLowerN(char* text, int numChars) {
    for (char* p = text; p && *p != '\0' && numChars != 0; p = mbcs::Inc(p), --numChars)
        if (mbcs::CharBytes(p) == 1)
            *p = static_cast<char>(mbcs::ToLower(static_cast<unsigned char>(*p)));
}

int String::MBCSPtrCharacterIndex(char const* text, char const* ptr) {
    if (!text || !ptr || ptr <= text)
        return 0;
    return mbcs::CharsInBytes(text, static_cast<int>(ptr - text));
}

} // namespace tekit

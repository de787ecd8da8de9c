// Assigning and appending: every kind of storage receives text through RequestBufferSize and
// the copy routines, which truncate silently where the storage cannot grow.
#include "strings/MultiByteChars.h"
#include "strings/WideText.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <string>

namespace tekit {

namespace {

/// Bytes of `text` up to `maxBytes` (negative: to the terminator); beyond 32 bits it raises.
int TextBytes(char const* text, int maxBytes, char const* function) {
    if (!text)
        return 0;
    size_t const n = maxBytes < 0 ? std::strlen(text) : strnlen(text, size_t(maxBytes));
    if (n > size_t(INT_MAX) - 16)
        Throw32BitOverflowException(function, TE_FILE_BASE_NAME, __LINE__, true);
    return static_cast<int>(n);
}

/// Copies `numBytes` of `src` into `dest` of `destSize` bytes, in the current mode's form.
void CopyBytes(char* dest, char const* src, int numBytes, int destSize, int* cachedSize) {
    if (String::IsMultiByteSupportEnabled())
        String::MBCSStringCopyMaxN(dest, src, numBytes, destSize, cachedSize);
    else
        String::StringCopyMaxN(dest, src, numBytes, destSize, cachedSize);
}

/// True when `p` points into the buffer of `s` (a source that a resize could move or free).
bool PointsInto(String const& s, char const* p) {
    auto const address = reinterpret_cast<std::uintptr_t>(p);
    auto const start = reinterpret_cast<std::uintptr_t>(s.GetBufferReadPtr());
    return address - start < std::uintptr_t(std::max(s.GetBufferSize(), 0));
}

/// Copies `numBytes` bytes of `src`, which holds no NUL among them, into `dest` of `destSize`
/// bytes. When they fit they are copied whole, as both modes do unless the count ends inside a
/// double-byte character; otherwise they are cut as the current mode cuts.
void CopyKnownBytes(char* dest, char const* src, int numBytes, int destSize, int* cachedSize) {
    if (numBytes < destSize && (!String::IsMultiByteSupportEnabled() || src[numBytes] == '\0')) {
        std::memmove(dest, src, size_t(numBytes));
        dest[numBytes] = '\0';
        *cachedSize = numBytes + 1;
        return;
    }
    CopyBytes(dest, src, numBytes, destSize, cachedSize);
}

} // namespace

void String::Assign(char const* text) {
    AssignUsingNumBytesInsteadOfNumChars(text, -1, false);
}

void String::Assign(String const& text) {
    if (&text == this)
        return;
    AssignUsingNumBytesInsteadOfNumChars(text.GetBufferReadPtr(), text.GetNumBytes(), false);
}

void String::Assign(char const* text, int numChars, bool /*reserved*/) {
    if (!text || *text == '\0' || numChars == 0) {
        Clear();
        return;
    }
    int numBytes = -1;
    if (numChars >= 0)
        numBytes = m_isMultiByteSupportEnabled ? mbcs::NBCnt(text, numChars) : numChars;
    AssignUsingNumBytesInsteadOfNumChars(text, numBytes, false);
}

void String::AssignUsingNumBytesInsteadOfNumChars(char const* text, int numBytes,
                                                  bool /*reserved*/) {
    if (!text || *text == '\0' || numBytes == 0) {
        Clear();
        return;
    }
    int const n = TextBytes(text, numBytes, "String::Assign");
    if (PointsInto(*this, text)) {
        std::string const own(text, size_t(n));
        AssignUsingNumBytesInsteadOfNumChars(own.c_str(), n, false);
        return;
    }
    int const available = RequestBufferSize(n + 1, false, false);
    char* dest = GetBufferWritePtr();
    CopyKnownBytes(dest, text, n, available, &m_cachedSize);
}

void String::AppendBytes(char const* text, int numBytes) {
    int const n = TextBytes(text, numBytes, "String::Append");
    if (n == 0)
        return;
    if (PointsInto(*this, text)) {
        std::string const own(text, size_t(n));
        AppendBytes(own.c_str(), n);
        return;
    }
    int const length = GetNumBytes();
    int const available = RequestBufferSize(length + n + 1, true, false);
    if (available - length < 2)
        return; // no room for even one byte and the terminator
    char* dest = GetBufferWritePtr();
    int copied = 0;
    CopyKnownBytes(dest + length, text, n, available - length, &copied);
    SetCachedSize(length + std::max(copied, 1));
}

void String::ReplaceBytes(int byteOffset, int numBytes, char const* text, int textBytes) {
    int const length = GetNumBytes();
    byteOffset = std::clamp(byteOffset, 0, length);
    numBytes = std::clamp(numBytes, 0, length - byteOffset);
    int const n = TextBytes(text, textBytes, "String::ReplaceBytes");
    std::string own;
    if (PointsInto(*this, text)) {
        own.assign(text, size_t(n));
        text = own.c_str();
    }
    int const newLength = length - numBytes + n;
    // Ask for room for the old text too: a shared block keeps only the bytes asked for, and the
    // tail is moved after the resize.
    int const needed = std::max(newLength, length) + 1;
    int const available = RequestBufferSize(needed, true, false);
    if (available >= needed) {
        char* p = GetBufferWritePtr();
        std::memmove(p + byteOffset + n, p + byteOffset + numBytes,
                     size_t(length - byteOffset - numBytes + 1));
        if (n > 0)
            std::memcpy(p + byteOffset, text, size_t(n));
        SetCachedSize(newLength + 1);
        return;
    }
    // The storage cannot hold the result: build it aside and let the copy cut it safely.
    char const* old = GetBufferReadPtr();
    std::string result(old, size_t(byteOffset));
    result.append(text ? text : "", size_t(n));
    result.append(old + byteOffset + numBytes, size_t(length - byteOffset - numBytes));
    AssignUsingNumBytesInsteadOfNumChars(result.c_str(), int(result.size()), false);
}

String& String::operator+=(String const& text) {
    AppendBytes(text.GetBufferReadPtr(), text.GetNumBytes());
    return *this;
}

String& String::operator+=(char const* text) {
    AppendBytes(text, -1);
    return *this;
}

String& String::operator+=(wchar_t const* text) {
    std::string const narrow = detail::ToNarrow(text, -1);
    AppendBytes(narrow.c_str(), int(narrow.size()));
    return *this;
}

void String::Assign(wchar_t const* text) {
    std::string const narrow = detail::ToNarrow(text, -1);
    AssignUsingNumBytesInsteadOfNumChars(narrow.c_str(), int(narrow.size()), false);
}

} // namespace tekit

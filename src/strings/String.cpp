// The storage-independent core of String: virtual defaults, process-wide switches, the shared
// empty block, measures and single characters, obscuring and the string assertion.
#include "tekit/strings/String.h"

#include "strings/MultiByteChars.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/CopyOnWriteMemory.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace tekit {

bool String::m_isMultiByteSupportEnabled = false;

String::~String() = default;

char* String::GetPtr(int charIndex) {
    int const numBytes = GetNumBytes();
    char* p = GetBufferWritePtr();
    if (!p || charIndex <= 0)
        return p;
    if (m_isMultiByteSupportEnabled)
        return mbcs::NInc(p, charIndex);
    return p + std::min(charIndex, numBytes);
}

void String::ReleasePtr() {
    InvalSizeCache();
}

void String::Clear() {
    if (GetBufferSize() < 1) {
        InvalSizeCache();
        return;
    }
    if (char* p = GetBufferWritePtr())
        p[0] = '\0';
    SetCachedSize(1);
}

void String::ClearMemory() {}

bool String::IsGlobalConstant() const {
    return false;
}

CopyOnWriteMemory* String::GetCopyOnWriteMemory() const {
    return nullptr;
}

void String::EnableMultiByteSupport(bool enable) {
    m_isMultiByteSupportEnabled = enable;
}

bool String::IsMultiByteSupportEnabled() {
    return m_isMultiByteSupportEnabled;
}

GlobalConstantCopyOnWriteMemory* String::EmptyStrCOWM() {
    // Built in static storage on first use and never destroyed, so that strings destroyed late
    // in process shutdown can still release it.
    alignas(GlobalConstantCopyOnWriteMemory) static unsigned char
        storage[sizeof(GlobalConstantCopyOnWriteMemory)];
    static GlobalConstantCopyOnWriteMemory* const block = new (storage)
        GlobalConstantCopyOnWriteMemory(reinterpret_cast<unsigned char const*>(""), 1, false);
    return block;
}

// ---- Measures ---------------------------------------------------------------------------

int String::MeasureNumBytes() const {
    // Measured within the buffer, so a caller's buffer without a terminator is never overrun.
    char const* p = GetBufferReadPtr();
    int const limit = GetBufferSize();
    int const n = (p && limit > 0) ? static_cast<int>(strnlen(p, size_t(limit))) : 0;
    m_cachedSize = n + 1;
    return n;
}

int String::GetNumChars() const {
    if (!m_isMultiByteSupportEnabled)
        return GetNumBytes();
    return mbcs::Len(GetBufferReadPtr());
}

int String::GetSize() const {
    return GetNumBytes() + 1;
}

bool String::IsEmpty() const {
    char const* p = GetBufferReadPtr();
    return !p || GetBufferSize() < 1 || *p == '\0';
}

int String::CharToByteIndex(int charIndex) const {
    if (charIndex <= 0)
        return 0;
    if (m_isMultiByteSupportEnabled)
        return mbcs::NBCnt(GetBufferReadPtr(), charIndex);
    return std::min(charIndex, GetNumBytes());
}

int String::ByteToCharIndex(int byteIndex) const {
    if (byteIndex <= 0)
        return 0;
    byteIndex = std::min(byteIndex, GetNumBytes());
    if (m_isMultiByteSupportEnabled)
        return mbcs::CharsInBytes(GetBufferReadPtr(), byteIndex);
    return byteIndex;
}

int String::IndexToOffset(int charIndex) const {
    return CharToByteIndex(charIndex);
}

int String::OffsetToIndex(int byteOffset) const {
    return ByteToCharIndex(byteOffset);
}

unsigned short String::GetChar(int charIndex) const {
    if (charIndex < 0)
        return 0;
    int const offset = CharToByteIndex(charIndex);
    if (offset >= GetNumBytes())
        return 0;
    char const* p = GetBufferReadPtr() + offset;
    if (m_isMultiByteSupportEnabled)
        return mbcs::GetChar(p);
    return static_cast<unsigned char>(*p);
}

unsigned short String::GetFirstChar() const {
    return GetChar(0);
}

unsigned short String::GetLastChar() const {
    if (IsEmpty())
        return 0;
    char const* p = GetLastCharPtr();
    if (m_isMultiByteSupportEnabled)
        return mbcs::GetChar(p);
    return static_cast<unsigned char>(*p);
}

char const* String::GetLastCharPtr() const {
    char const* text = GetBufferReadPtr();
    int const numBytes = GetNumBytes();
    if (!text || numBytes == 0)
        return text ? text : "";
    if (m_isMultiByteSupportEnabled)
        return mbcs::Dec(text, text + numBytes);
    return text + numBytes - 1;
}

bool String::IsPtrToLastChar(unsigned char const* ptr) const {
    return ptr && !IsEmpty() && ptr == reinterpret_cast<unsigned char const*>(GetLastCharPtr());
}

// ---- Single characters ----------------------------------------------------------------

void String::SetChar(int charIndex, unsigned short ch) {
    if (m_isMultiByteSupportEnabled || mbcs::CharValueBytes(ch) == 2) {
        MBSetChar(charIndex, ch);
        return;
    }
    int const numBytes = GetNumBytes();
    if (charIndex < 0 || charIndex >= numBytes)
        return;
    char* p = GetBufferWritePtr();
    p[charIndex] = static_cast<char>(ch);
    SetCachedSize(ch == 0 ? charIndex + 1 : numBytes + 1);
}

void String::MBSetChar(int charIndex, unsigned short ch) {
    int const numBytes = GetNumBytes();
    int const offset = CharToByteIndex(charIndex);
    if (charIndex < 0 || offset >= numBytes)
        return;
    int const oldBytes =
        m_isMultiByteSupportEnabled ? mbcs::CharBytes(GetBufferReadPtr() + offset) : 1;
    if (ch == 0) {
        GetBufferWritePtr()[offset] = '\0';
        SetCachedSize(offset + 1);
        return;
    }
    char encoded[2];
    int const newBytes = mbcs::PutChar(encoded, ch);
    if (newBytes == oldBytes) {
        std::memcpy(GetBufferWritePtr() + offset, encoded, size_t(newBytes));
        SetCachedSize(numBytes + 1);
        return;
    }
    ReplaceBytes(offset, oldBytes, encoded, newBytes);
}

void String::InsertChar(unsigned short ch, int charIndex) {
    if (ch == 0)
        return;
    char encoded[2];
    int const n = mbcs::PutChar(encoded, ch);
    ReplaceBytes(CharToByteIndex(charIndex), 0, encoded, n);
}

void String::AppendChar(unsigned short ch) {
    if (ch == 0)
        return;
    char encoded[2];
    AppendBytes(encoded, mbcs::PutChar(encoded, ch));
}

// ---- Obscuring --------------------------------------------------------------------------

namespace {

/// The key of byte position `i`; bytes 1-255 are rotated within 1-255, so no byte becomes NUL.
int ScrambleKey(int i) {
    return static_cast<int>((31LL * i + 7) % 255);
}

/// Rotates each byte of `s` (1-255) by `sign` times its key within 1-255; returns the text's
/// byte count, which stays, or 0 for an empty text (left alone).
int RotateBytes(String& s, int sign) {
    int const numBytes = s.GetNumBytes();
    if (numBytes == 0)
        return 0;
    auto* p = reinterpret_cast<unsigned char*>(s.GetBufferWritePtr());
    for (int i = 0; i < numBytes; ++i)
        p[i] = static_cast<unsigned char>((p[i] - 1 + sign * ScrambleKey(i) + 255) % 255 + 1);
    return numBytes;
}

} // namespace

void String::Scramble() {
    if (int const numBytes = RotateBytes(*this, 1))
        SetCachedSize(numBytes + 1);
}

void String::Unscramble() {
    if (int const numBytes = RotateBytes(*this, -1))
        SetCachedSize(numBytes + 1);
}

// ---- Assertions and orderings ---------------------------------------------------------

void String::ThrowStringAssertion(char const* condition, char const* function) {
    TE_RAISE_ASSERTION(condition ? condition : "", function ? function : "");
}

bool StringPtrLessThan::operator()(String const* a, String const* b) const {
    if (!a || !b)
        return !a && b; // a null pointer sorts first
    return a->Compare(*b) < 0;
}

bool StringPtrLessThanNoCase::operator()(String const* a, String const* b) const {
    if (!a || !b)
        return !a && b;
    return a->Compare(*b, true) < 0;
}

} // namespace tekit

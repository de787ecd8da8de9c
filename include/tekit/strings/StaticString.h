// Text in an inline array of N + 1 bytes: never allocates, silently truncates.
//
//   StaticString<64> label;
//   label = longText;   // keeps the first 64 bytes (never half a double-byte character)
//
// Instantiated (and exported) for N = 64, 256, 260 (the Windows path limit) and 1024.
#pragma once

#include "tekit/strings/String.h"

#include <cstring>

namespace tekit {

template <int N> class StaticString : public String {
public:
    StaticString() { m_buffer[0] = '\0'; }
    StaticString(char const* text) {
        m_buffer[0] = '\0';
        String::Assign(text);
    }
    StaticString(String const& text) {
        m_buffer[0] = '\0';
        String::Assign(text);
    }
    StaticString(StaticString const& other) : String() {
        m_buffer[0] = '\0';
        String::Assign(other);
    }
    StaticString& operator=(StaticString const& other) {
        String::Assign(other);
        return *this;
    }
    virtual StaticString& operator=(String const& other) {
        String::Assign(other);
        return *this;
    }
    /// A text that fits is copied in place; a longer one is cut as every assignment cuts.
    StaticString& operator=(char const* text) {
        size_t const n = text ? strnlen(text, N + 1) : 0;
        if (n == 0 || n > size_t(N)) {
            String::Assign(text);
            return *this;
        }
        std::memmove(m_buffer, text, n); // the text may lie in this buffer
        m_buffer[n] = '\0';
        SetCachedSize(int(n) + 1);
        return *this;
    }
    /// A text that fits is appended in place; a longer one is cut as every append cuts.
    String& operator+=(char const* text) final {
        int const size = GetCachedSize();
        if (text && size > 0 && size <= N + 1) {
            size_t const room = size_t(N + 1 - size);
            size_t const n = strnlen(text, room + 1);
            if (n <= room) {
                std::memmove(m_buffer + size - 1, text, n);
                m_buffer[size - 1 + int(n)] = '\0';
                SetCachedSize(size + int(n));
                return *this;
            }
        }
        return String::operator+=(text);
    }
    using String::operator+=;

    char const* GetBufferReadPtr() const override { return m_buffer; }
    char* GetBufferWritePtr() override {
        InvalSizeCache();
        return m_buffer;
    }
    /// N: the most text it holds (the array has one more byte, for the terminator).
    int GetBufferSize() const override { return N; }
    /// Always N + 1, whatever is asked: the storage cannot grow.
    int RequestBufferSize(int, bool, bool) override { return N + 1; }

private:
    char m_buffer[N + 1];
};

// The four sizes are instantiated once, inside the library, and other files refer to that
// copy. Not on Windows: the DLL exports no member defined inside the class body, so callers
// there instantiate the (all inline) members themselves.
#if !defined(_WIN32)
#define TEKIT_STATIC_STRING_EXTERN 1
#endif

#if defined(TEKIT_STATIC_STRING_EXTERN)
extern template class TEKIT_API StaticString<64>;
extern template class TEKIT_API StaticString<256>;
extern template class TEKIT_API StaticString<260>;
extern template class TEKIT_API StaticString<1024>;
#endif
#undef TEKIT_STATIC_STRING_EXTERN

} // namespace tekit

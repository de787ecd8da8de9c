// BufferString: a string over a caller's fixed buffer, truncating at its capacity.
#include "tekit/strings/BufferString.h"

#include "strings/MultiByteChars.h"

#include <algorithm>
#include <cstring>

namespace tekit {

BufferString::BufferString() {
    SetCachedSize(-1);
}

// The caller's buffer keeps its contents: it may already hold the text to work on.
BufferString::BufferString(char* buffer, int size) {
    SetBuffer(buffer, size);
}

BufferString::BufferString(char const* buffer, int size) {
    SetBuffer(buffer, size);
}

BufferString::BufferString(char* buffer, char const* initial, int size) {
    SetBuffer(buffer, size);
    String::Assign(initial);
}

BufferString::BufferString(char* buffer, String const& initial, int size) {
    SetBuffer(buffer, size);
    String::Assign(initial);
}

BufferString& BufferString::operator=(String const& other) {
    String::Assign(other);
    return *this;
}

BufferString& BufferString::operator=(char const* text) {
    String::Assign(text);
    return *this;
}

void BufferString::SetBuffer(char* buffer, int size) {
    m_buffer = buffer;
    m_size = size;
    m_readOnly = false;
    InvalSizeCache();
}

void BufferString::SetBuffer(char const* buffer, int size) {
    SetBuffer(const_cast<char*>(buffer), size);
    m_readOnly = true;
}

void BufferString::AdvanceBuffer(int numChars) {
    if (!m_buffer || numChars <= 0)
        return;
    char const* next = nullptr;
    if (IsMultiByteSupportEnabled())
        next = mbcs::NInc(m_buffer, numChars);
    else
        next = m_buffer + std::min(numChars, GetNumBytes());
    int const skipped = static_cast<int>(next - m_buffer);
    m_buffer += skipped;
    if (m_size >= 0)
        m_size = std::max(m_size - skipped, 0);
    InvalSizeCache();
}

char const* BufferString::GetBufferReadPtr() const {
    return m_buffer ? m_buffer : "";
}

char* BufferString::GetBufferWritePtr() {
    if (m_readOnly)
        ThrowStringAssertion("!m_readOnly", "BufferString::GetBufferWritePtr");
    InvalSizeCache();
    return m_buffer;
}

// A negative size means unknown: the buffer then holds exactly its text and terminator.
int BufferString::GetBufferSize() const {
    if (!m_buffer)
        return 0;
    if (m_size < 0)
        return static_cast<int>(std::strlen(m_buffer)) + 1;
    return m_size;
}

int BufferString::RequestBufferSize(int, bool, bool) {
    return GetBufferSize();
}

} // namespace tekit

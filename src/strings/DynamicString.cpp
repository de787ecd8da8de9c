// DynamicString: heap text over a shared copy-on-write block.
#include "tekit/strings/DynamicString.h"

#include "tekit/strings/CopyOnWriteMemory.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>

namespace tekit {

CopyOnWriteMemory* DynamicString::SharedEmpty() {
    return String::EmptyStrCOWM()->AddRef();
}

DynamicString::DynamicString() : m_memory(SharedEmpty()) {}

DynamicString::DynamicString(int numBytes) : m_memory(SharedEmpty()) {
    RequestBufferSize(numBytes, true, false);
}

DynamicString::DynamicString(char const* text, bool copy) : m_memory(SharedEmpty()) {
    if (copy) {
        *this = text;
        return;
    }
    if (!text || *text == '\0')
        return;
    int const size = static_cast<int>(std::strlen(text)) + 1;
    m_memory->SetContentsToConstant(&m_memory, reinterpret_cast<unsigned char const*>(text), size);
    SetCachedSize(size);
}

DynamicString::DynamicString(String const& other) : m_memory(SharedEmpty()) {
    Assign(other);
}

DynamicString::DynamicString(DynamicString&& other) noexcept
    : String(other), m_memory(other.m_memory) {
    other.m_memory = SharedEmpty();
    other.SetCachedSize(1);
    if (!m_memory)
        m_memory = SharedEmpty();
}

DynamicString::DynamicString(wchar_t const* text) : m_memory(SharedEmpty()) {
    String::Assign(text);
}

DynamicString::DynamicString(ForDynamicStringNullMemoryReference) : m_memory(nullptr) {}

DynamicString& DynamicString::operator=(DynamicString&& other) noexcept {
    if (this == &other)
        return *this;
    std::swap(m_memory, other.m_memory);
    int const size = CachedSizeOf(other);
    other.SetCachedSize(GetCachedSize());
    SetCachedSize(size);
    if (!m_memory) {
        m_memory = SharedEmpty();
        SetCachedSize(1);
    }
    return *this;
}

DynamicString& DynamicString::operator=(String const& other) {
    Assign(other);
    return *this;
}

// In place when the block is this string's alone and has room: what the general assignment
// would do, without its storage calls.
DynamicString& DynamicString::operator=(char const* text) {
    size_t const n = text ? std::strlen(text) : 0;
    if (n > 0 && n < size_t(INT_MAX) - 16) {
        char* data = OwnBuffer(int(n) + 1);
        if (!data && !PointsIntoBlock(text))
            data = FreshBuffer(int(n) + 1);
        if (data) {
            std::memmove(data, text, n); // the text may lie in this buffer
            data[n] = '\0';
            SetCachedSize(int(n) + 1);
            return *this;
        }
    }
    String::Assign(text);
    return *this;
}

char* DynamicString::FreshBuffer(int numBytes) {
    if (!m_memory || (m_memory->IsExclusive() && !m_memory->OwnsData()))
        return nullptr;
    if (m_memory->IsExclusive()) {
        m_memory->PrivateResize(numBytes, false, false);
    } else {
        CopyOnWriteMemory* fresh = CopyOnWriteMemory::NewHeapBlock();
        try {
            fresh->PrivateResize(numBytes, false, false);
        } catch (...) {
            fresh->Drop();
            throw;
        }
        CopyOnWriteMemory const* old = m_memory;
        m_memory = fresh;
        old->Drop();
    }
    char* data = reinterpret_cast<char*>(m_memory->m_data);
    data[0] = '\0';
    SetCachedSize(1);
    return data;
}

bool DynamicString::PointsIntoBlock(char const* p) const {
    if (!m_memory)
        return false;
    auto const start = reinterpret_cast<std::uintptr_t>(m_memory->GetReadPtr());
    return reinterpret_cast<std::uintptr_t>(p) - start <
           std::uintptr_t(std::max(m_memory->GetBufferSize(), 0));
}

DynamicString& DynamicString::operator=(wchar_t const* text) {
    String::Assign(text);
    return *this;
}

void DynamicString::EnsureMemory() {
    if (!m_memory) {
        m_memory = SharedEmpty();
        SetCachedSize(1);
    }
}

// Shares the other string's block when it has one; a string without a block (static or
// buffer storage) is copied, except that empty text just refers to the shared empty block.
void DynamicString::Assign(String const& other) {
    if (&other == this)
        return;
    EnsureMemory();
    CopyOnWriteMemory const* block = other.GetCopyOnWriteMemory();
    if (block) {
        m_memory->SetContents(&m_memory, block);
        SetCachedSize(CachedSizeOf(other));
        return;
    }
    if (other.IsEmpty()) {
        Clear();
        return;
    }
    String::Assign(other);
}

void DynamicString::AssignUnshared(DynamicString const& other) {
    Assign(static_cast<String const&>(other));
}

// ---- Appending ------------------------------------------------------------------------

// A block of this string's own grows in place by the growth rule; anything else (a shared
// block, constant text, an unknown size, a text from this very buffer that growing could
// move, a count that ends inside a double-byte character) takes the general path.
void DynamicString::AppendText(char const* text, int numBytes) {
    if (numBytes <= 0)
        return;
    int const size = GetCachedSize();
    if (size <= 0 || numBytes >= INT_MAX - 16 - size ||
        (text[numBytes] != '\0' && IsMultiByteSupportEnabled())) {
        AppendBytes(text, numBytes);
        return;
    }
    int const needed = size + numBytes;
    char* data = OwnBuffer(size);
    if (!data && size == 1 && !PointsIntoBlock(text))
        data = FreshBuffer(needed); // the first text of an empty string
    if (!data) {
        AppendBytes(text, numBytes);
        return;
    }
    if (needed > m_memory->m_bufferSize && !m_memory->GrowWithinAllocation(needed)) {
        if (PointsIntoBlock(text)) {
            AppendBytes(text, numBytes);
            return;
        }
        m_memory->PrivateResize(needed, true, false);
        data = reinterpret_cast<char*>(m_memory->m_data);
    }
    std::memmove(data + size - 1, text, size_t(numBytes)); // may lie after the text
    data[needed - 1] = '\0';
    SetCachedSize(needed);
}

// Clearing never writes into the block, so clearing a shared string never copies it.
void DynamicString::Clear() {
    EnsureMemory();
    m_memory->SetContents(&m_memory, EmptyStrCOWM());
    SetCachedSize(1);
}

bool DynamicString::IsGlobalConstant() const {
    return m_memory && m_memory->IsGlobalConstant();
}

char* DynamicString::GetBufferWritePtr() {
    if (char* data = OwnBuffer(1)) {
        InvalSizeCache();
        return data;
    }
    EnsureMemory();
    if (!m_memory->GetReadPtr() || m_memory->GetBufferSize() < 1) {
        RequestBufferSize(1, false, false);
    } else if (HoldsConstantAlone()) {
        m_memory->ResizeBuffer(&m_memory, m_memory->GetBufferSize(), true, true);
    }
    InvalSizeCache();
    return reinterpret_cast<char*>(m_memory->GetWritePtr(&m_memory));
}

// Asks the block for max(numBytes, 1) bytes. Afterwards the block is this string's alone and
// owns its bytes, so a write may follow; without `keepContents` the text is then empty.
int DynamicString::RequestBufferSize(int numBytes, bool keepContents, bool exactSize) {
    numBytes = std::max(numBytes, 1);
    char* data = exactSize ? nullptr : OwnBuffer(numBytes);
    int const bufferSize = data ? m_memory->GetBufferSize() : 0;
    if (data && !keepContents) {
        // Room enough in a block of this string's own: nothing to resize.
        data[0] = '\0';
        SetCachedSize(1);
        return bufferSize;
    }
    if (data && GetCachedSize() > 0 && GetCachedSize() <= bufferSize)
        return bufferSize; // and the known text already fits with its terminator
    EnsureMemory();
    if (HoldsConstantAlone() && !exactSize && numBytes <= m_memory->GetBufferSize()) {
        // Constant text held alone would be written in place: take an owned copy instead.
        exactSize = true;
        if (keepContents)
            numBytes = m_memory->GetBufferSize();
    }
    int const oldLength = keepContents ? GetNumBytes() : 0;
    int const size = m_memory->ResizeBuffer(&m_memory, numBytes, keepContents, exactSize);
    if (!keepContents) {
        *m_memory->GetWritePtr(&m_memory) = '\0';
        SetCachedSize(1);
    } else if (size <= oldLength) {
        // An exact shrink below the text keeps what fits and stays terminated.
        auto* p = reinterpret_cast<char*>(m_memory->GetWritePtr(&m_memory));
        p[size - 1] = '\0';
        int const length =
            IsMultiByteSupportEnabled() ? SizeOfMBCSSubString(p, -1, size - 1) : size - 1;
        p[length] = '\0';
        SetCachedSize(length + 1);
    }
    return size;
}

bool DynamicString::HoldsConstantAlone() const {
    return m_memory && m_memory->IsExclusive() && !m_memory->OwnsData();
}

int DynamicString::Reserve(int numBytes, bool exactSize) {
    return RequestBufferSize(numBytes, true, exactSize);
}

int DynamicString::Reserve(int numBytes) {
    return RequestBufferSize(numBytes, true, false);
}

void DynamicString::ListAppend(String const& item, char const* separator) {
    if (!IsEmpty() && separator)
        *this += separator;
    *this += item;
}

DynamicString operator+(String const& a, String const& b) {
    DynamicString result(a);
    result += b;
    return result;
}

DynamicString operator+(String const& a, char const* b) {
    DynamicString result(a);
    result += b;
    return result;
}

DynamicString operator+(char const* a, String const& b) {
    DynamicString result(a);
    result += b;
    return result;
}

} // namespace tekit

// DynamicString: heap text over a shared copy-on-write block.
#include "tekit/strings/DynamicString.h"

#include "tekit/strings/CopyOnWriteMemory.h"

#include <algorithm>
#include <cstring>

namespace tekit {

namespace {

CopyOnWriteMemory* SharedEmpty() {
    return String::EmptyStrCOWM()->AddRef();
}

} // namespace

DynamicString::DynamicString() : m_memory(SharedEmpty()) {}

DynamicString::DynamicString(int numBytes) : m_memory(SharedEmpty()) {
    RequestBufferSize(numBytes, true, false);
}

DynamicString::DynamicString(char const* text, bool copy) : m_memory(SharedEmpty()) {
    if (copy) {
        String::Assign(text);
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

DynamicString::DynamicString(DynamicString const& other)
    : String(other), m_memory(other.m_memory ? other.m_memory->AddRef() : SharedEmpty()) {}

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

DynamicString::~DynamicString() {
    if (m_memory)
        m_memory->Release();
}

DynamicString& DynamicString::operator=(DynamicString const& other) {
    Assign(other);
    return *this;
}

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

DynamicString& DynamicString::operator=(char const* text) {
    String::Assign(text);
    return *this;
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

void DynamicString::Assign(DynamicString const& other) {
    Assign(static_cast<String const&>(other));
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

char const* DynamicString::GetBufferReadPtr() const {
    if (!m_memory || !m_memory->GetReadPtr())
        return "";
    return reinterpret_cast<char const*>(m_memory->GetReadPtr());
}

char* DynamicString::GetBufferWritePtr() {
    EnsureMemory();
    if (!m_memory->GetReadPtr() || m_memory->GetBufferSize() < 1) {
        RequestBufferSize(1, false, false);
    } else if (HoldsConstantAlone()) {
        m_memory->ResizeBuffer(&m_memory, m_memory->GetBufferSize(), true, true);
    }
    InvalSizeCache();
    return reinterpret_cast<char*>(m_memory->GetWritePtr(&m_memory));
}

int DynamicString::GetBufferSize() const {
    if (!m_memory || !m_memory->GetReadPtr())
        return 1; // the empty text ""
    return m_memory->GetBufferSize();
}

CopyOnWriteMemory* DynamicString::GetCopyOnWriteMemory() const {
    return m_memory;
}

// Asks the block for max(numBytes, 1) bytes. Afterwards the block is this string's alone and
// owns its bytes, so a write may follow; without `keepContents` the text is then empty.
int DynamicString::RequestBufferSize(int numBytes, bool keepContents, bool exactSize) {
    EnsureMemory();
    numBytes = std::max(numBytes, 1);
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
    return m_memory && m_memory->GetRefCount() == 1 && !m_memory->OwnsData();
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

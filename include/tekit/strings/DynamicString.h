// Heap text over a shared copy-on-write block.
//
// A copy shares the block (one interlocked add); the first write gives the writer a private
// copy. An empty string refers to the process-wide empty block and allocates nothing.
//
//   DynamicString a("some text", true);
//   DynamicString b = a;            // shares a's block
//   b += " more";                   // b now has its own block; a is unchanged
#pragma once

#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/String.h"

#include <climits>
#include <cstring>
#include <string_view>

namespace tekit {

/// Tag for a string whose memory reference its owner sets up later.
struct ForDynamicStringNullMemoryReference {};

class TEKIT_API DynamicString : public String {
public:
    DynamicString();
    /// Empty, with `numBytes` reserved.
    explicit DynamicString(int numBytes);
    /// With `copy` false the string refers to `text` in place and copies it only at the first
    /// write, so the caller's text must outlive the string.
    DynamicString(char const* text, bool copy = true);
    DynamicString(String const& other);
    /// Shares the other string's block: one interlocked add, no allocation.
    DynamicString(DynamicString const& other)
        : String(other), m_memory(other.m_memory ? other.m_memory->Share() : SharedEmpty()) {}
    DynamicString(DynamicString&& other) noexcept;
#if TEKIT_HAS_OLE
    DynamicString(_bstr_t const& text);
#endif
    DynamicString(wchar_t const* text);
    explicit DynamicString(ForDynamicStringNullMemoryReference);
    ~DynamicString() override {
        if (m_memory)
            m_memory->Drop();
    }

    DynamicString& operator=(DynamicString const& other) {
        Assign(other);
        return *this;
    }
    DynamicString& operator=(DynamicString&& other) noexcept;
    DynamicString& operator=(String const& other);
    DynamicString& operator=(char const* text);
    DynamicString& operator=(wchar_t const* text);

    /// Appends in place while the block is this string's alone and has room; otherwise grows
    /// the block by the growth rule, or appends as every string does.
    String& operator+=(char const* text) final {
        if (text && *text) {
            size_t const n = std::strlen(text);
            if (!AppendInPlace(text, n))
                AppendText(text, n < size_t(INT_MAX) ? int(n) : INT_MAX);
        }
        return *this;
    }
    /// The other string's size is cached, but its text is measured again up to that size: a
    /// text written through a pointer since its size was cached may have become shorter.
    String& operator+=(String const& text) final {
        char const* p = text.GetBufferReadPtr();
        int const numBytes = text.GetNumBytes();
        if (p && numBytes > 0) {
            size_t const n = strnlen(p, size_t(numBytes));
            if (p[n] != '\0' || !AppendInPlace(p, n))
                AppendText(p, int(n));
        }
        return *this;
    }
    using String::operator+=;

    using String::Assign;
    void Assign(String const& other) final;
    void Clear() final;
    /// True while the string holds a global constant block: an interned constant's, or the
    /// shared empty block when it is empty.
    bool IsGlobalConstant() const final;
    char const* GetBufferReadPtr() const final {
        char const* p = m_memory ? reinterpret_cast<char const*>(m_memory->GetReadPtr()) : nullptr;
        return p ? p : "";
    }
    /// Copies the block first when it is shared or refers to constant text.
    char* GetBufferWritePtr() override;
    int GetBufferSize() const final {
        return m_memory && m_memory->GetReadPtr() ? m_memory->GetBufferSize() : 1; // 1: ""
    }
    CopyOnWriteMemory* GetCopyOnWriteMemory() const final {
        return m_memory;
    }
    /// Asks the block for max(numBytes, 1) bytes. Afterwards the block is this string's alone;
    /// without `keepContents` the text is empty.
    int RequestBufferSize(int numBytes, bool keepContents, bool exactSize) final;
    /// Shares the other string's block (one interlocked add for the new reference, and the
    /// old block released).
    virtual void Assign(DynamicString const& other) final {
        if (!m_memory || !other.m_memory) {
            AssignUnshared(other);
            return;
        }
        if (m_memory != other.m_memory) {
            CopyOnWriteMemory const* old = m_memory;
            m_memory = other.m_memory->Share(); // add first, release second
            old->Drop();
        }
        SetCachedSize(CachedSizeOf(other));
    }
    virtual int Reserve(int numBytes, bool exactSize) final;
    virtual int Reserve(int numBytes) final;

    /// Appends `separator` (only when this list is not empty yet) and `item`: building a list
    /// one item at a time.
    void ListAppend(String const& item, char const* separator);

    /// The text as a view (valid until the next write).
    std::string_view View() const {
        return {GetBufferReadPtr(), size_t(GetNumBytes())};
    }

protected:
    /// The holder: the string's only link to its block (null only for a string built with
    /// ForDynamicStringNullMemoryReference until its owner sets it).
    CopyOnWriteMemory* m_memory = nullptr;

private:
    /// A reference on the shared empty block.
    static CopyOnWriteMemory* SharedEmpty();
    /// Assign(DynamicString const&) when either string has no block yet.
    void AssignUnshared(DynamicString const& other);
    /// The block's bytes when this string may write `numBytes` of them in place: the block is
    /// its alone, owns its bytes and holds at least that many. Null otherwise.
    char* OwnBuffer(int numBytes) const {
        CopyOnWriteMemory* block = m_memory;
        if (!block || !block->m_ownsData || numBytes > block->m_bufferSize || !block->IsExclusive())
            return nullptr;
        return reinterpret_cast<char*>(block->m_data);
    }
    /// Appends the `n` bytes of `text`, which end at its terminator, when the block is this
    /// string's alone and its allocation already has room (the buffer grows by the growth rule
    /// within it): the common case, in place. False otherwise.
    bool AppendInPlace(char const* text, size_t n) {
        int const size = GetCachedSize();
        CopyOnWriteMemory* block = m_memory;
        if (size <= 0 || n >= size_t(INT_MAX - size) || !block || !block->m_ownsData ||
            size > block->m_bufferSize || !block->IsExclusive())
            return false;
        int const needed = size + static_cast<int>(n);
        if (needed > block->m_bufferSize && !block->GrowWithinAllocation(needed))
            return false;
        char* data = reinterpret_cast<char*>(block->m_data);
        std::memmove(data + size - 1, text, n + 1); // may lie in this buffer, after the text
        SetCachedSize(needed);
        return true;
    }
    /// Appends the `numBytes` bytes of `text`, none of them NUL (the text may lie in this
    /// string's buffer).
    void AppendText(char const* text, int numBytes);
    /// What RequestBufferSize(numBytes, false, false) gives a string whose block is its own and
    /// owns its bytes, or is shared: the block's bytes, its text dropped. Null (nothing done)
    /// for the other cases, which take the general path.
    char* FreshBuffer(int numBytes);
    /// True when `p` lies in the block's buffer, which a resize may move or free.
    bool PointsIntoBlock(char const* p) const;
    /// Refers to the shared empty block when no block was set up.
    void EnsureMemory();
    /// True when the block is this string's alone but refers to constant text it must not
    /// write (built with `copy` false): a write takes an owned copy first.
    bool HoldsConstantAlone() const;
};

TEKIT_API DynamicString operator+(String const& a, String const& b);
TEKIT_API DynamicString operator+(String const& a, char const* b);
TEKIT_API DynamicString operator+(char const* a, String const& b);

} // namespace tekit

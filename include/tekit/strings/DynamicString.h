// Heap text over a shared copy-on-write block.
//
// A copy shares the block (one interlocked add); the first write gives the writer a private
// copy. An empty string refers to the process-wide empty block and allocates nothing.
//
//   DynamicString a("some text", true);
//   DynamicString b = a;            // shares a's block
//   b += " more";                   // b now has its own block; a is unchanged
#pragma once

#include "tekit/strings/String.h"

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
    DynamicString(DynamicString const& other);
    DynamicString(DynamicString&& other) noexcept;
#if TEKIT_HAS_OLE
    DynamicString(_bstr_t const& text);
#endif
    DynamicString(wchar_t const* text);
    explicit DynamicString(ForDynamicStringNullMemoryReference);
    ~DynamicString() override;

    DynamicString& operator=(DynamicString const& other);
    DynamicString& operator=(DynamicString&& other) noexcept;
    DynamicString& operator=(String const& other);
    DynamicString& operator=(char const* text);
    DynamicString& operator=(wchar_t const* text);

    using String::Assign;
    void Assign(String const& other) override;
    void Clear() override;
    /// True while the string holds a global constant block: an interned constant's, or the
    /// shared empty block when it is empty.
    bool IsGlobalConstant() const override;
    char const* GetBufferReadPtr() const override;
    /// Copies the block first when it is shared or refers to constant text.
    char* GetBufferWritePtr() override;
    int GetBufferSize() const override;
    CopyOnWriteMemory* GetCopyOnWriteMemory() const override;
    /// Asks the block for max(numBytes, 1) bytes. Afterwards the block is this string's alone;
    /// without `keepContents` the text is empty.
    int RequestBufferSize(int numBytes, bool keepContents, bool exactSize) override;
    virtual void Assign(DynamicString const& other);
    virtual int Reserve(int numBytes, bool exactSize);
    virtual int Reserve(int numBytes);

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

// Reference-counted byte blocks behind heap strings and streams.
//
// Copying a string copies a pointer and adds a reference; the first write to a shared block
// gives the writer a private copy. Every operation that may replace the block takes the
// holder variable (`CopyOnWriteMemory** holder`), which is the owner's only link to its block:
//
//   CopyOnWriteMemory* holder = other->AddRef();        // share
//   unsigned char* p = holder->GetWritePtr(&holder);    // private copy if shared
//   holder->Release();
#pragma once

#include "tekit/Export.h"

#include <cstdint>

namespace tekit {

class TEKIT_API CopyOnWriteMemory {
public:
    CopyOnWriteMemory();
    /// With `copy` false the block refers to `bytes` in place (not owning); with `copy` true it
    /// allocates `size` bytes rounded up to 4 and copies them.
    CopyOnWriteMemory(unsigned char const* bytes, int size, bool copy);
    /// Copies the four fields as they stand (count included): for building a block, not for
    /// sharing one. Sharing is always done with AddRef. A copy of a block that owns its data
    /// points at the same bytes, so only one of the two may keep owning them (the destructor
    /// frees owned data).
    CopyOnWriteMemory(CopyOnWriteMemory const& other);
    CopyOnWriteMemory& operator=(CopyOnWriteMemory const& other);

    /// Frees the data when the block owns it.
    virtual ~CopyOnWriteMemory();
    /// Takes a reference (heap blocks count it; static blocks do not) and returns the block.
    virtual CopyOnWriteMemory* AddRef() const;
    /// Drops a reference; a heap block deletes itself when its count reaches 0.
    virtual void Release() const;
    virtual bool IsGlobalConstant() const;

    unsigned char const* GetReadPtr() const { return m_data; }
    int GetBufferSize() const { return m_bufferSize; }
    /// The current reference count (read atomically).
    std::int32_t GetRefCount() const;
    bool OwnsData() const { return m_ownsData; }

    /// Returns a pointer through which the holder may write; copies the block first when it is
    /// shared (count other than 1).
    unsigned char* GetWritePtr(CopyOnWriteMemory** holder);
    /// Makes the holder's block at least `size` bytes and returns the new buffer size. Without
    /// `exactSize` a buffer never shrinks and grows with slack (size + 4 + size / 32); sizes
    /// are rounded up to 4. A shared block is never resized: the holder gets a new block. A
    /// failed allocation raises TE_OUT_OF_MEMORY and leaves the holder's block as it was.
    int ResizeBuffer(CopyOnWriteMemory** holder, int size, bool keepContents, bool exactSize);
    /// The holder's block afterwards holds a private copy of `size` bytes.
    void SetContents(CopyOnWriteMemory** holder, unsigned char const* bytes, int size);
    /// The holder afterwards shares `other` (reference added before the old one is released).
    void SetContents(CopyOnWriteMemory** holder, CopyOnWriteMemory const* other);
    /// The holder afterwards refers to `bytes` in place, not owning them.
    void SetContentsToConstant(CopyOnWriteMemory** holder, unsigned char const* bytes, int size);
    /// Frees owned data and nulls the data pointer; the buffer size is left as it is.
    void ClearAll();

protected:
    /// Resize of a block that only one holder uses.
    void PrivateResize(int size, bool keepContents, bool exactSize);
    static CopyOnWriteMemory* NewHeapBlock();

    int m_bufferSize = 0;
    unsigned char* m_data = nullptr;
    bool m_ownsData = false;
    mutable std::int32_t m_refCount = 1;
};

/// A block over constant text that is never freed and never written: its count starts at 2,
/// so no holder ever sees itself as the only one and every write goes to a copy.
class TEKIT_API GlobalConstantCopyOnWriteMemory : public CopyOnWriteMemory {
public:
    GlobalConstantCopyOnWriteMemory(unsigned char const* bytes, int size, bool copy);
    /// Copies and moves copy the fields; a move also takes over owned data, so the source no
    /// longer frees it.
    GlobalConstantCopyOnWriteMemory(GlobalConstantCopyOnWriteMemory const& other);
    GlobalConstantCopyOnWriteMemory(GlobalConstantCopyOnWriteMemory&& other) noexcept;
    GlobalConstantCopyOnWriteMemory& operator=(GlobalConstantCopyOnWriteMemory const& other);
    GlobalConstantCopyOnWriteMemory& operator=(GlobalConstantCopyOnWriteMemory&& other) noexcept;
    bool IsGlobalConstant() const override;
};

} // namespace tekit

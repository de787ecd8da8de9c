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

#include <atomic>
#include <cstdint>

namespace tekit {

class DynamicString;

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

private:
    friend class DynamicString;

    /// AddRef without a virtual call: a heap block is counted here, inline; any other kind
    /// goes through its own AddRef.
    CopyOnWriteMemory* Share() const {
        if (!m_counted)
            return AddRef();
        std::atomic_ref<std::int32_t>(m_refCount).fetch_add(1, std::memory_order_relaxed);
        return const_cast<CopyOnWriteMemory*>(this);
    }
    /// Release without a virtual call for a heap block. Its last holder deletes it without an
    /// interlocked decrement: with a count of 1 nothing else can reach the block.
    void Drop() const {
        if (!m_counted) {
            Release();
        } else if (IsExclusive() || std::atomic_ref<std::int32_t>(m_refCount)
                                            .fetch_sub(1, std::memory_order_acq_rel) == 1) {
            delete this;
        }
    }
    /// Grows the buffer of an owned block to hold `size` bytes (more than it has) by the growth
    /// rule when the allocation under it already has the room; false when the heap must be
    /// asked (PrivateResize).
    bool GrowWithinAllocation(int size) {
        long long const grown = GrownSize(size);
        if (!m_ownsData || grown > m_allocated)
            return false;
        m_bufferSize = static_cast<int>(grown);
        return true;
    }
    /// The growth rule: a buffer that must grow to `size` bytes gets size + 4 + size / 32
    /// (arithmetic shift), rounded up to a multiple of 4.
    static constexpr long long GrownSize(int size) {
        return (static_cast<long long>(size) + 4 + (size >> 5) + 3) & ~3LL;
    }
    /// The exclusive test: one holder only, so the holder may write in place.
    bool IsExclusive() const {
        return std::atomic_ref<std::int32_t>(m_refCount).load(std::memory_order_acquire) == 1;
    }
    /// Bytes at `m_data` when owned: the buffer size or more, as the heap allocation went.
    int m_allocated = 0;
    /// A heap block: counted with interlocked operations and deleted by its last Release.
    bool m_counted = false;
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

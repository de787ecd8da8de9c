// Reference-counted byte blocks: the base (static or embedded) block, the heap block that
// every copy creates, and the global constant block.
//
// Allocation failures name this file ("CopyOnWrite") in their reports.
#include "tekit/errors/Raise.h"
#include "tekit/strings/CopyOnWriteMemory.h"

#include <algorithm>
#include <atomic>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace tekit {

namespace {

/// The block that copies, resizes of shared blocks and SetContents create: counted with
/// interlocked operations and deleted by its last Release (see Share and Drop).
class HeapCopyOnWriteMemory final : public CopyOnWriteMemory {
public:
    CopyOnWriteMemory* AddRef() const override {
        std::atomic_ref<std::int32_t>(m_refCount).fetch_add(1, std::memory_order_relaxed);
        return const_cast<HeapCopyOnWriteMemory*>(this);
    }
    void Release() const override {
        if (GetRefCount() == 1 ||
            std::atomic_ref<std::int32_t>(m_refCount).fetch_sub(1, std::memory_order_acq_rel) == 1)
            delete this;
    }
};

constexpr char kFunction[] = "CopyOnWriteMemory::ResizeBuffer";

/// Buffers up to this size are allocated in whole size classes.
constexpr int kLargestSizeClass = 256;

/// The bytes to allocate under a buffer of `size` bytes. A buffer that grows takes a power of
/// two from 32 up to kLargestSizeClass, so a run of short appends calls the heap once per size
/// class instead of at every step of the growth rule; the buffer size itself still follows
/// the rule. Larger and exact sizes are allocated as they are.
int AllocationFor(int size, bool exactSize) {
    if (exactSize || size > kLargestSizeClass)
        return size;
    int sizeClass = 32;
    while (sizeClass < size)
        sizeClass <<= 1;
    return sizeClass;
}

} // namespace

CopyOnWriteMemory::CopyOnWriteMemory() = default;

CopyOnWriteMemory::CopyOnWriteMemory(unsigned char const* bytes, int size, bool copy) {
    if (!copy) {
        m_data = const_cast<unsigned char*>(bytes);
        m_bufferSize = size;
        return;
    }
    PrivateResize(size, false, true);
    if (bytes && size > 0)
        std::memcpy(m_data, bytes, size_t(size));
}

CopyOnWriteMemory::CopyOnWriteMemory(CopyOnWriteMemory const& other)
    : m_bufferSize(other.m_bufferSize), m_data(other.m_data), m_ownsData(other.m_ownsData),
      m_refCount(other.GetRefCount()), m_allocated(other.m_allocated) {}

// The kind (heap or not) stays: it belongs to the object, not to the fields it copies.
CopyOnWriteMemory& CopyOnWriteMemory::operator=(CopyOnWriteMemory const& other) {
    m_bufferSize = other.m_bufferSize;
    m_data = other.m_data;
    m_ownsData = other.m_ownsData;
    m_refCount = other.GetRefCount();
    m_allocated = other.m_allocated;
    return *this;
}

CopyOnWriteMemory::~CopyOnWriteMemory() {
    ClearAll();
}

CopyOnWriteMemory* CopyOnWriteMemory::AddRef() const {
    return const_cast<CopyOnWriteMemory*>(this);
}

void CopyOnWriteMemory::Release() const {}

bool CopyOnWriteMemory::IsGlobalConstant() const {
    return false;
}

std::int32_t CopyOnWriteMemory::GetRefCount() const {
    return std::atomic_ref<std::int32_t>(m_refCount).load(std::memory_order_acquire);
}

CopyOnWriteMemory* CopyOnWriteMemory::NewHeapBlock() {
    CopyOnWriteMemory* block = new HeapCopyOnWriteMemory;
    block->m_counted = true;
    return block;
}

void CopyOnWriteMemory::PrivateResize(int size, bool keepContents, bool exactSize) {
    if (!exactSize && size <= m_bufferSize)
        return; // buffers never shrink unless asked to
    // A size that does not fit a 32-bit int is an allocation failure rather than a wrapped (and
    // too small) request: a process cannot get a block near 2 GB anyway.
    long long const rounded =
        !exactSize ? GrownSize(size) : (static_cast<long long>(std::max(size, 0)) + 3) & ~3LL;
    if (rounded > INT_MAX)
        TE_RAISE(TE_OUT_OF_MEMORY, "", kFunction);
    auto const newSize = static_cast<int>(rounded);
    if (m_ownsData && !exactSize && newSize <= m_allocated) {
        m_bufferSize = newSize; // the allocation already holds the grown buffer
        return;
    }
    int const allocation = AllocationFor(newSize, exactSize);
    size_t const allocBytes = std::max<size_t>(size_t(allocation), 1); // malloc(0) may give null
    // A block of size classes moves to the next class by a fresh allocation and a copy of at
    // most kLargestSizeClass bytes: the heap's per-thread caches serve that at a fraction of
    // what a reallocation costs. Larger blocks reallocate, which may grow in place.
    if (m_ownsData && keepContents && m_allocated > kLargestSizeClass) {
        void* grown = std::realloc(m_data, allocBytes);
        if (!grown)
            TE_RAISE(TE_OUT_OF_MEMORY, "", kFunction);
        m_data = static_cast<unsigned char*>(grown);
    } else {
        // Allocate before freeing, so a failure leaves the block as it was.
        auto* fresh = static_cast<unsigned char*>(std::malloc(allocBytes));
        if (!fresh)
            TE_RAISE(TE_OUT_OF_MEMORY, "", kFunction);
        if (keepContents && m_data && m_bufferSize > 0)
            std::memcpy(fresh, m_data, size_t(std::min(m_bufferSize, newSize)));
        if (m_ownsData)
            std::free(m_data);
        m_data = fresh;
        m_ownsData = true;
    }
    m_allocated = allocation;
    m_bufferSize = newSize;
}

int CopyOnWriteMemory::ResizeBuffer(CopyOnWriteMemory** holder, int size, bool keepContents,
                                    bool exactSize) {
    if (IsExclusive()) {
        PrivateResize(size, keepContents, exactSize);
        return (*holder)->m_bufferSize;
    }
    CopyOnWriteMemory* fresh = NewHeapBlock();
    try {
        fresh->PrivateResize(size, false, exactSize);
    } catch (...) {
        fresh->Release();
        throw;
    }
    if (keepContents && m_data) {
        int const n = std::min({m_bufferSize, size, fresh->m_bufferSize});
        if (n > 0)
            std::memcpy(fresh->m_data, m_data, size_t(n));
    }
    CopyOnWriteMemory const* old = *holder;
    *holder = fresh;
    old->Drop();
    return fresh->m_bufferSize;
}

unsigned char* CopyOnWriteMemory::GetWritePtr(CopyOnWriteMemory** holder) {
    if (IsExclusive())
        return m_data;
    // A shared block is copied whole into a block of this one's own; this one may go.
    ResizeBuffer(holder, m_bufferSize, true, true);
    return (*holder)->m_data;
}

void CopyOnWriteMemory::SetContents(CopyOnWriteMemory** holder, unsigned char const* bytes,
                                    int size) {
    CopyOnWriteMemory* target = *holder;
    int count = bytes ? std::max(size, 0) : 0;
    std::vector<unsigned char> own; // bytes from the block itself may be freed by the resize
    unsigned char const* end = target->m_data + std::max(target->m_bufferSize, 0);
    if (count > 0 && target->m_data && bytes >= target->m_data && bytes < end) {
        count = std::min<int>(count, int(end - bytes));
        own.assign(bytes, bytes + count);
        bytes = own.data();
    }
    target->ResizeBuffer(holder, size, false, true);
    if (count > 0)
        std::memcpy((*holder)->m_data, bytes, size_t(count));
}

void CopyOnWriteMemory::SetContents(CopyOnWriteMemory** holder, CopyOnWriteMemory const* other) {
    if (*holder == other)
        return;
    CopyOnWriteMemory const* old = *holder;
    *holder = other->Share(); // add first, release second
    old->Drop();
}

void CopyOnWriteMemory::SetContentsToConstant(CopyOnWriteMemory** holder,
                                              unsigned char const* bytes, int size) {
    CopyOnWriteMemory* target = *holder;
    if (!target->IsExclusive()) {
        target = NewHeapBlock();
        CopyOnWriteMemory const* old = *holder;
        *holder = target;
        old->Drop();
    }
    target->ClearAll();
    target->m_data = const_cast<unsigned char*>(bytes);
    target->m_bufferSize = size;
    target->m_ownsData = false;
}

void CopyOnWriteMemory::ClearAll() {
    if (m_ownsData)
        std::free(m_data);
    m_data = nullptr;
    m_ownsData = false;
    m_allocated = 0;
}

GlobalConstantCopyOnWriteMemory::GlobalConstantCopyOnWriteMemory(unsigned char const* bytes,
                                                                 int size, bool copy)
    : CopyOnWriteMemory(bytes, size, copy) {
    m_refCount = 2;
}

GlobalConstantCopyOnWriteMemory::GlobalConstantCopyOnWriteMemory(
    GlobalConstantCopyOnWriteMemory const& other) = default;

GlobalConstantCopyOnWriteMemory::GlobalConstantCopyOnWriteMemory(
    GlobalConstantCopyOnWriteMemory&& other) noexcept
    : CopyOnWriteMemory(other) {
    other.m_ownsData = false;
}

GlobalConstantCopyOnWriteMemory&
GlobalConstantCopyOnWriteMemory::operator=(GlobalConstantCopyOnWriteMemory const& other) {
    CopyOnWriteMemory::operator=(other);
    return *this;
}

GlobalConstantCopyOnWriteMemory&
GlobalConstantCopyOnWriteMemory::operator=(GlobalConstantCopyOnWriteMemory&& other) noexcept {
    if (this != &other) {
        ClearAll();
        CopyOnWriteMemory::operator=(other);
        other.m_ownsData = false;
    }
    return *this;
}

bool GlobalConstantCopyOnWriteMemory::IsGlobalConstant() const {
    return true;
}

} // namespace tekit

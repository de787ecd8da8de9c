// Heap sort, quick sort, insertion sort and binary search over arrays of fixed-size items.
//
// Items are moved as raw bytes; the common sizes 4 and 8 get their own instantiation so a move
// is one load and one store. Every index stays inside the array even when a callback's order
// is inconsistent, and a callback that throws leaves the array a permutation of its items.
#include "tekit/toolbox/Sort.h"

#include "toolbox/BinarySearch.h"
#include "toolbox/FlatGuard.h"
#include "toolbox/SwapBytes.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace tekit::toolbox {
namespace {

/// The caller's order, or the byte order when there is no callback.
struct Order {
    CompareFunction compare;
    std::size_t size;
    int operator()(void const* a, void const* b) const {
        return compare ? compare(a, b) : std::memcmp(a, b, size);
    }
};

/// Moves of items whose size is known when compiling.
template <std::size_t N> struct FixedItems {
    std::size_t Size() const { return N; }
    void Copy(void* to, void const* from) const { std::memcpy(to, from, N); }
    void Swap(void* a, void* b) const {
        unsigned char t[N];
        std::memcpy(t, a, N);
        std::memcpy(a, b, N);
        std::memcpy(b, t, N);
    }
};

/// Moves of items of any size, swapped through a small buffer piece by piece.
struct AnyItems {
    std::size_t size;
    std::size_t Size() const { return size; }
    void Copy(void* to, void const* from) const { std::memcpy(to, from, size); }
    void Swap(void* a, void* b) const { SwapBytes(a, b, size); }
};

/// One spare item: on the stack when small, else on the heap.
class Scratch {
public:
    explicit Scratch(std::size_t size)
        : m_heap(size > sizeof m_local ? std::malloc(size) : nullptr, &std::free) {}
    bool Ok(std::size_t size) const { return size <= sizeof m_local || m_heap; }
    void* Get() { return m_heap ? m_heap.get() : m_local; }

private:
    alignas(std::max_align_t) unsigned char m_local[64];
    std::unique_ptr<void, void (*)(void*)> m_heap;
};

template <class Items> class Sorter {
public:
    Sorter(char* base, Items items, Order order, void* spare)
        : m_base(base), m_items(items), m_order(order), m_spare(spare) {}

    char* At(std::size_t i) const { return m_base + i * m_items.Size(); }

    /// Heap sort of [lo, hi).
    void Heap(std::size_t lo, std::size_t hi) {
        std::size_t const n = hi - lo;
        for (std::size_t i = n / 2; i-- > 0;)
            SiftDown(lo, i, n);
        for (std::size_t end = n; end-- > 1;) {
            m_items.Swap(At(lo), At(lo + end));
            SiftDown(lo, 0, end);
        }
    }

    /// Introspective quick sort of [lo, hi): partitions until runs are short, then insertion;
    /// past the depth limit the run is heap sorted, so the worst case stays O(n log n).
    void Quick(std::size_t lo, std::size_t hi, int depth) {
        while (hi - lo > kShortRun) {
            if (depth-- == 0)
                return Heap(lo, hi);
            std::size_t const cut = Partition(lo, hi);
            if (cut - lo < hi - cut) { // recurse into the smaller side: the stack stays shallow
                Quick(lo, cut, depth);
                lo = cut;
            } else {
                Quick(cut, hi, depth);
                hi = cut;
            }
        }
        Insertion(lo, hi);
    }

    /// Stable insertion sort of [lo, hi): each item's place is found before anything moves,
    /// then the run it passes moves up in one block.
    void Insertion(std::size_t lo, std::size_t hi) {
        std::size_t const size = m_items.Size();
        for (std::size_t i = lo + 1; i < hi; ++i) {
            if (m_order(At(i), At(i - 1)) >= 0)
                continue;
            std::size_t j = i - 1;
            while (j > lo && m_order(At(i), At(j - 1)) < 0)
                --j;
            m_items.Copy(m_spare, At(i));
            std::memmove(At(j + 1), At(j), (i - j) * size);
            m_items.Copy(At(j), m_spare);
        }
    }

private:
    static constexpr std::size_t kShortRun = 16;

    /// The spare item's slot while it is out of the array; put back when the sift ends, also
    /// when a callback throws, so the array never loses an item.
    struct Hole {
        Sorter& sorter;
        std::size_t index;
        ~Hole() { sorter.m_items.Copy(sorter.At(index), sorter.m_spare); }
    };

    /// Floyd's sift of the heap [lo, lo + n) from `root`: down to a leaf by the larger child
    /// (one comparison a level), then back up to the taken item's place.
    void SiftDown(std::size_t lo, std::size_t root, std::size_t n) {
        m_items.Copy(m_spare, At(lo + root));
        Hole hole{*this, lo + root};
        std::size_t i = root;
        for (std::size_t child; (child = 2 * i + 1) < n; i = child) {
            // Which child is larger is a coin toss on random data: no branch on it.
            if (child + 1 < n)
                child += std::size_t(m_order(At(lo + child), At(lo + child + 1)) < 0);
            m_items.Copy(At(lo + i), At(lo + child));
            hole.index = lo + child;
        }
        while (i > root) {
            std::size_t const parent = (i - 1) / 2;
            if (m_order(At(lo + parent), m_spare) >= 0)
                break;
            m_items.Copy(At(lo + i), At(lo + parent));
            hole.index = lo + parent;
            i = parent;
        }
    }

    /// Hoare partition of [lo, hi) around the median of three; returns the cut c with
    /// lo < c < hi, every item before it not above the pivot and every item from it not below.
    std::size_t Partition(std::size_t lo, std::size_t hi) {
        std::size_t const mid = lo + (hi - lo) / 2, last = hi - 1;
        if (m_order(At(mid), At(lo)) < 0)
            m_items.Swap(At(mid), At(lo));
        if (m_order(At(last), At(mid)) < 0) {
            m_items.Swap(At(last), At(mid));
            if (m_order(At(mid), At(lo)) < 0)
                m_items.Swap(At(mid), At(lo));
        }
        m_items.Copy(m_spare, At(mid)); // compared against a copy: swaps may move the pivot
        std::size_t i = lo, j = last;
        for (;;) {
            // The bounds matter only for an inconsistent order; a consistent one stops at the
            // items the median of three left at both ends.
            while (++i < last && m_order(At(i), m_spare) < 0) {
            }
            while (--j > lo && m_order(m_spare, At(j)) < 0) {
            }
            if (i >= j)
                return i;
            m_items.Swap(At(i), At(j));
        }
    }

    char* m_base;
    Items m_items;
    Order m_order;
    void* m_spare;
};

enum class Algorithm { Heap, Quick, Insertion };

int DepthLimit(std::size_t n) {
    int depth = 0;
    for (; n > 1; n >>= 1)
        depth += 2;
    return depth;
}

template <class Items>
void Run(Algorithm algorithm, void* base, std::size_t n, Items items, Order order, void* spare) {
    Sorter<Items> sorter(static_cast<char*>(base), items, order, spare);
    switch (algorithm) {
    case Algorithm::Heap:
        return sorter.Heap(0, n);
    case Algorithm::Quick:
        return sorter.Quick(0, n, DepthLimit(n));
    case Algorithm::Insertion:
        return sorter.Insertion(0, n);
    }
}

std::int32_t Sort(Algorithm algorithm, void* base, std::int32_t numItems, std::int32_t itemSize,
                  CompareFunction compare) {
    if (numItems < 0 || itemSize < 1 || (!base && numItems > 0))
        return 0;
    if (numItems < 2)
        return 1;
    auto const size = static_cast<std::size_t>(itemSize);
    auto const n = static_cast<std::size_t>(numItems);
    Scratch spare(size);
    if (!spare.Ok(size))
        return 0;
    Order const order{compare, size};
    return Guarded(0, [&] {
        if (size == 4)
            Run(algorithm, base, n, FixedItems<4>{}, order, spare.Get());
        else if (size == 8)
            Run(algorithm, base, n, FixedItems<8>{}, order, spare.Get());
        else
            Run(algorithm, base, n, AnyItems{size}, order, spare.Get());
        return 1;
    });
}

} // namespace

// Short ranges are walked from their low end: a few more comparisons than halving, but on
// neighbouring items.
std::int32_t SearchSorted(void const* items, std::int32_t numItems, std::size_t itemSize,
                          void const* key, CompareFunction compare) {
    auto const* base = static_cast<char const*>(items);
    Order const order{compare, itemSize};
    std::int32_t low = 0, high = numItems - 1, probe = 0;
    bool keyGreater = false;
    while (low <= high) {
        probe = high - low + 1 >= 7 ? low + (high - low) / 2 : low;
        int const c = order(key, base + std::size_t(probe) * itemSize);
        if (c == 0)
            return probe;
        keyGreater = c > 0;
        if (keyGreater)
            low = probe + 1;
        else
            high = probe - 1;
    }
    return -(probe + (keyGreater ? 1 : 0)) - 1;
}

} // namespace tekit::toolbox

using tekit::toolbox::Algorithm;

extern "C" std::int32_t TEKIT_STDCALL HeapSort(void* items, std::int32_t numItems,
                                               std::int32_t itemSize, CompareFunction compare) {
    return tekit::toolbox::Sort(Algorithm::Heap, items, numItems, itemSize, compare);
}

extern "C" std::int32_t TEKIT_STDCALL QuickSort(void* items, std::int32_t numItems,
                                                std::int32_t itemSize, CompareFunction compare) {
    return tekit::toolbox::Sort(Algorithm::Quick, items, numItems, itemSize, compare);
}

extern "C" std::int32_t TEKIT_STDCALL InsertionSort(void* items, std::int32_t numItems,
                                                    std::int32_t itemSize,
                                                    CompareFunction compare) {
    return tekit::toolbox::Sort(Algorithm::Insertion, items, numItems, itemSize, compare);
}

extern "C" std::int32_t TEKIT_STDCALL BinSearch(void const* items, std::int32_t numItems,
                                                std::int32_t itemSize, void const* key,
                                                CompareFunction compare) {
    if (!items || !key || numItems < 1 || itemSize < 1)
        return -1;
    return tekit::toolbox::Guarded(-1, [&] {
        return tekit::toolbox::SearchSorted(items, numItems, std::size_t(itemSize), key, compare);
    });
}

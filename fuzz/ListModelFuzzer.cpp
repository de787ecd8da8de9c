// Fuzzes the list functions against a model: a byte vector of the same items, and the capacity
// the growth policy must give. Every operation's result, the items and the capacity are
// compared after each step.
//
// Input: one byte for the item size (1 to 12), then operations of three bytes each: the
// operation, a position (read as signed, so the special and out-of-range ones come up) and
// a count. Items inserted are taken from the following input bytes.
#include "tekit/toolbox/List.h"
#include "tekit/toolbox/Sort.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// The header fields as the block holds them.
struct Header {
    std::uint32_t magic;
    std::int32_t percentIncrease, minItemsPerAlloc, capacity, itemSize, numItems;
};

Header ReadHeader(ListType list) {
    Header h;
    std::memcpy(&h, list->block, sizeof h);
    return h;
}

class Model {
public:
    explicit Model(std::int32_t itemSize) : size(itemSize) {}

    std::int32_t Count() const { return std::int32_t(bytes.size() / size); }
    std::string Item(std::int32_t index) const { return bytes.substr(index * size, size); }

    /// The 0-based index of an existing item, -1 when there is none.
    std::int32_t Index(std::int32_t position) const {
        if (Count() == 0 || position < -1 || position > Count())
            return -1;
        return position == -1 ? 0 : position == 0 ? Count() - 1 : position - 1;
    }

    /// Growth for an insertion of `count` items, as the policy defines it.
    void GrowFor(std::int64_t count) {
        if (Count() + count <= capacity)
            return;
        std::int64_t amount =
            std::max<std::int64_t>((100 + std::int64_t(percent)) * capacity / 100, minItems);
        capacity += std::int32_t(std::max<std::int64_t>(amount, 0) + count);
    }

    std::int32_t size;
    std::string bytes;
    std::int32_t capacity = 0, percent = 10, minItems = 4;
};

/// The binary search as documented: halving ranges of 7 or more, a linear finish below.
std::int32_t ModelSearch(Model const& m, std::string const& key) {
    std::int32_t low = 0, high = m.Count() - 1, probe = 0;
    bool greater = false;
    while (low <= high) {
        probe = high - low + 1 >= 7 ? (low + high) / 2 : low;
        int const c = std::memcmp(key.data(), m.Item(probe).data(), m.size);
        if (c == 0)
            return probe;
        greater = c > 0;
        (greater ? low : high) = greater ? probe + 1 : probe - 1;
    }
    return -(probe + (greater ? 1 : 0)) - 1;
}

void CheckSame(ListType list, Model const& m) {
    Header const h = ReadHeader(list);
    Check(h.magic == 0x4C495354 && h.itemSize == m.size && h.numItems == m.Count());
    Check(h.capacity == m.capacity && h.percentIncrease == m.percent &&
          h.minItemsPerAlloc == m.minItems);
    Check(list->size == 24u + std::uint32_t(h.capacity * h.itemSize) + 4u);
    Check(ListNumItems(list) == m.Count());
    Check(m.bytes.empty() ||
          std::memcmp(ListGetDataPtr(list), m.bytes.data(), m.bytes.size()) == 0);
}

class Input {
public:
    Input(std::uint8_t const* data, std::size_t size) : m_data(data), m_left(size) {}
    bool Empty() const { return m_left == 0; }
    std::uint8_t Byte() { return m_left ? (--m_left, *m_data++) : 0; }
    std::string Bytes(std::size_t n) {
        std::string out(n, '\0');
        for (char& c : out)
            c = char(Byte());
        return out;
    }

private:
    std::uint8_t const* m_data;
    std::size_t m_left;
};

void Step(ListType list, Model& m, Input& in) {
    std::uint8_t const op = in.Byte();
    std::int32_t const position = std::int8_t(in.Byte()) % (m.Count() + 4);
    std::int32_t const count = std::int8_t(in.Byte()) % 9;
    std::int32_t const n = m.Count();
    std::string buffer(std::size_t(std::max(count, 1)) * m.size, '\x5A');
    switch (op % 12) {
    case 0: { // insert, from input or zero-filled
        bool const zero = op & 0x80;
        std::string const items = zero ? std::string(buffer.size(), '\0') : in.Bytes(buffer.size());
        std::int32_t const at = position == n + 1 ? 0 : position;
        bool const ok = count >= 1 && at >= -1 && at <= n && n + count <= 4096;
        if (n + count > 4096)
            return;
        Check(ListInsertItems(list, zero ? nullptr : items.data(), position, count) == ok);
        if (ok) {
            m.GrowFor(count);
            std::int32_t const index = at == 0 || (at == -1 && n == 0) ? n : at == -1 ? 0 : at - 1;
            m.bytes.insert(std::size_t(index) * m.size, items.substr(0, count * m.size));
        }
        break;
    }
    case 1: { // remove, keeping the removed items
        std::int32_t const start = m.Index(position);
        bool const ok = count >= 1 && count <= n && start >= 0 && start + count <= n;
        ListRemoveItems(list, buffer.data(), position, count);
        if (ok) {
            Check(buffer.compare(0, count * m.size, m.bytes, start * m.size, count * m.size) == 0);
            m.bytes.erase(std::size_t(start) * m.size, std::size_t(count) * m.size);
        }
        break;
    }
    case 2: { // get
        std::int32_t const start = m.Index(position);
        std::string const before = buffer;
        ListGetItems(list, buffer.data(), position, count);
        if (count >= 1 && start >= 0 && start + count <= n)
            Check(buffer.compare(0, count * m.size, m.bytes, start * m.size, count * m.size) == 0);
        else
            Check(buffer == before);
        void* const p = ListGetPtrToItem(list, position);
        Check((p != nullptr) == (start >= 0));
        break;
    }
    case 3: { // replace
        std::int32_t const start = m.Index(position);
        std::string const items = in.Bytes(buffer.size());
        ListReplaceItems(list, items.data(), position, count);
        if (count >= 1 && start >= 0 && start + count <= n)
            m.bytes.replace(std::size_t(start) * m.size, count * m.size, items, 0, count * m.size);
        break;
    }
    case 4: { // ordered insertion by byte order
        std::string const item = in.Bytes(m.size);
        if (n >= 4096)
            return;
        std::int32_t const found = ModelSearch(m, item);
        Check(ListInsertInOrder(list, item.data(), nullptr) == 1);
        m.GrowFor(1);
        std::int32_t const index = n == 0 ? 0 : found >= 0 ? found : -found - 1;
        m.bytes.insert(std::size_t(index) * m.size, item);
        break;
    }
    case 5: { // search
        std::string const item = in.Bytes(m.size);
        std::int32_t const found = ModelSearch(m, item);
        Check(BinSearch(m.bytes.data(), n, m.size, item.data(), nullptr) == (n ? found : -1));
        Check(ListBinSearch(list, item.data(), nullptr) == (found >= 0 && n ? found + 1 : 0));
        std::int32_t const start = m.Index(position);
        std::int32_t expected = 0;
        for (std::int32_t i = std::max(start, 0); start >= 0 && i < n && !expected; ++i)
            if (m.Item(i) == item)
                expected = i + 1;
        Check(ListFindItem(list, item.data(), position, nullptr) == expected);
        break;
    }
    case 6: { // room ahead
        std::int32_t const want = position * 3 + count;
        Check(ListPreAllocate(list, want) == 1);
        if (m.capacity - n < want)
            m.capacity = n + want;
        break;
    }
    case 7:
        ListCompact(list);
        m.capacity = n;
        break;
    case 8:
        ListClear(list);
        m.bytes.clear();
        break;
    case 9: { // sorts by byte order
        (count % 3 == 0   ? ListHeapSort
         : count % 3 == 1 ? ListQuickSort
                          : ListInsertionSort)(list, nullptr);
        std::vector<std::string> items;
        for (std::int32_t i = 0; i < n; ++i)
            items.push_back(m.Item(i));
        std::sort(items.begin(), items.end(), [&](auto const& a, auto const& b) {
            return std::memcmp(a.data(), b.data(), m.size) < 0;
        });
        m.bytes.clear();
        for (auto const& item : items)
            m.bytes += item;
        Check(ListIsSorted(list, nullptr) == 1);
        break;
    }
    case 10: { // duplicates out, first occurrences kept in order
        ListRemoveDuplicates(list, nullptr);
        std::string kept;
        for (std::int32_t i = 0; i < n; ++i) {
            std::string const item = m.Item(i);
            bool seen = false;
            for (std::size_t j = 0; j < kept.size() && !seen; j += m.size)
                seen = kept.compare(j, m.size, item) == 0;
            if (!seen)
                kept += item;
        }
        m.bytes = kept;
        break;
    }
    case 11: { // append to itself, through a copy, or set the policy
        if (count == 0) {
            m.minItems = position;
            m.percent = std::int8_t(op) / 2;
            ListSetAllocationPolicy(list, m.minItems, m.percent);
        } else if (2 * n <= 4096 && n > 0) {
            ListType const copy = ListCopy(list);
            Check(copy && ListEqual(copy, list) && ReadHeader(copy).capacity == n);
            Check(ListAppend(list, count % 2 ? list : copy) == 1);
            ListDispose(copy);
            m.bytes += m.bytes;
            m.capacity = 2 * n;
        }
        break;
    }
    }
    CheckSame(list, m);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input in(data, size);
    Model model(1 + in.Byte() % 12);
    ListType const list = ListCreate(model.size);
    Check(list != nullptr);
    while (!in.Empty())
        Step(list, model, in);
    ListDispose(list);
    return 0;
}

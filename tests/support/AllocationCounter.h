// Counts the heap objects that the library creates, to check the family's promises that some
// operations allocate nothing. The test binary replaces the global operator new; the library
// calls it like any other code of the process.
#pragma once

#include <cstddef>

namespace tekit::testing {

/// Whether the library's allocations are seen: a Windows DLL keeps its own operator new, so
/// there only the structural half of an allocation check can be made.
#if defined(_WIN32)
inline constexpr bool kSeesLibraryAllocations = false;
#else
inline constexpr bool kSeesLibraryAllocations = true;
#endif

/// The number of operator new calls so far in the process.
std::size_t AllocationCount();

/// Counts the allocations made while it is alive.
class AllocationScope {
public:
    AllocationScope() : m_start(AllocationCount()) {}
    std::size_t Count() const { return AllocationCount() - m_start; }

private:
    std::size_t m_start;
};

} // namespace tekit::testing

// The calling thread's identity: the POSIX implementation.
#include "platform/Thread.h"

#include <atomic>

namespace tekit::platform {

std::uint32_t CurrentThreadId() {
    // pthread_t is opaque; hand out small sequential ids, one per thread, on first use.
    static std::atomic<std::uint32_t> next{1};
    thread_local std::uint32_t const id = next.fetch_add(1, std::memory_order_relaxed);
    return id;
}

} // namespace tekit::platform

// The calling thread's identity: the Windows implementation.
#include "platform/Thread.h"
#include "platform/Win32.h"

namespace tekit::platform {

std::uint32_t CurrentThreadId() {
    // The Windows thread identifier: locks record it as their owner and the reader-writer
    // lock negates it, so it must be the system's value, never 0 for a live thread.
    return static_cast<std::uint32_t>(::GetCurrentThreadId());
}

} // namespace tekit::platform

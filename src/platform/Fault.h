// The fault seam: every platform call that can fail on a user's machine asks it first, so a
// test can make the Nth call of a kind fail with a native error of its choosing.
//
//   ArmFault(FaultKind::Write, 1, native::kDiskFull);   // the next write reports a full disk
//   ... code under test ...
//   DisarmFault(FaultKind::Write);
//
// An injected failure is returned exactly as the system's own would be, and the call does
// nothing. Unarmed, asking costs one relaxed load and a branch that is predicted not taken.
#pragma once

#include "platform/SystemError.h"

#include <atomic>
#include <cstdint>

namespace tekit::platform {

/// The kinds of calls a test can make fail.
enum class FaultKind : unsigned char {
    Open,            ///< opening an existing file
    Read,            ///< reading an open file
    Write,           ///< writing an open file
    Flush,           ///< flushing an open file to its disk
    Close,           ///< closing an open file
    Rename,          ///< renaming or replacing
    Delete,          ///< deleting a file or an empty directory
    Stat,            ///< asking what is at a path
    Attributes,      ///< changing permissions, the read-only flag, or copying them
    SetTimes,        ///< setting a file time
    DirectoryCreate, ///< creating one directory
    DirectoryList,   ///< listing a directory
    ModuleLoad,      ///< loading a shared module
    SymbolLookup,    ///< looking up a symbol of a loaded module
    Allocate,        ///< allocating or growing a block of the C run-time heap
    TemporaryFile,   ///< creating a new temporary file
};
inline constexpr int kFaultKindCount = static_cast<int>(FaultKind::TemporaryFile) + 1;

/// Arms `kind`: its `nth` call from now on (1: the next one) fails with `nativeError`, and with
/// `sticky` every call after it as well. `nth` 0 fails nothing and only counts the calls.
/// Arming starts the kind's call count again at 0.
void ArmFault(FaultKind kind, std::uint32_t nth, long nativeError, bool sticky = false);
/// Stops injecting failures of `kind`; its call count stays readable.
void DisarmFault(FaultKind kind);
void DisarmAllFaults();
/// The calls of `kind` made since it was armed, the failed ones included.
std::uint32_t FaultCallCount(FaultKind kind);

namespace detail {
extern std::atomic<bool> gAnyFaultArmed;
SystemError TakeFault(FaultKind kind, char const* apiFunction);
} // namespace detail

/// The failure injected into this call of `kind`, reported as a failure of `apiFunction`;
/// success (nothing to inject) unless a test armed the seam.
inline SystemError InjectedFailure(FaultKind kind, char const* apiFunction) {
    if (detail::gAnyFaultArmed.load(std::memory_order_relaxed)) [[unlikely]]
        return detail::TakeFault(kind, apiFunction);
    return {};
}

} // namespace tekit::platform

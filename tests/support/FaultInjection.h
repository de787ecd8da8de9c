// Arms the platform's fault seam for one scope: the Nth call of a kind fails with a native
// error, as if the system had said so, and nothing else changes.
//
//   ScopedFault const full(FaultKind::Write, 1, native::kDiskFull);
//   EXPECT_RAISES(source.CopyTo(target, true), TE_DISK_FULL);
//   EXPECT_TRUE(full.Fired());
//
// Native errors are named portably (platform::native::kDiskFull is ENOSPC on POSIX and
// ERROR_DISK_FULL on Windows), so a test reads the same on every platform.
#pragma once

#include "platform/Fault.h"
#include "platform/SystemError.h"

#include <cstdint>
#include <iterator>

namespace tekit::testing {

using platform::FaultKind;
namespace native = platform::native;

/// Fails the `nth` call of `kind` (and with `sticky` every later one) while it lives; always
/// disarms. `nth` kCountOnly fails nothing and only counts.
class ScopedFault {
public:
    static constexpr std::uint32_t kCountOnly = 0;

    ScopedFault(FaultKind kind, std::uint32_t nth, long nativeError = 0, bool sticky = false)
        : m_kind(kind), m_nth(nth) {
        platform::ArmFault(kind, nth, nativeError, sticky);
    }
    ~ScopedFault() { platform::DisarmFault(m_kind); }
    ScopedFault(ScopedFault const&) = delete;
    ScopedFault& operator=(ScopedFault const&) = delete;

    /// Calls of the kind since arming, the failed ones included.
    std::uint32_t Calls() const { return platform::FaultCallCount(m_kind); }
    /// Whether the armed call was reached, so a failure was injected.
    bool Fired() const { return m_nth != kCountOnly && Calls() >= m_nth; }

private:
    FaultKind m_kind;
    std::uint32_t m_nth;
};

/// Every kind of call the seam knows, for tests that go through them all.
inline constexpr FaultKind kAllFaultKinds[] = {
    FaultKind::Open,
    FaultKind::Read,
    FaultKind::Write,
    FaultKind::Flush,
    FaultKind::Close,
    FaultKind::Rename,
    FaultKind::Delete,
    FaultKind::Stat,
    FaultKind::Attributes,
    FaultKind::SetTimes,
    FaultKind::DirectoryCreate,
    FaultKind::DirectoryList,
    FaultKind::ModuleLoad,
    FaultKind::SymbolLookup,
    FaultKind::Allocate,
    FaultKind::TemporaryFile,
};
static_assert(std::size(kAllFaultKinds) == platform::kFaultKindCount);

} // namespace tekit::testing

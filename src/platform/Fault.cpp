// The fault seam's state: per kind, the call count and the failure plan a test set.
#include "platform/Fault.h"

#include <mutex>

namespace tekit::platform {

namespace detail {
std::atomic<bool> gAnyFaultArmed{false};
} // namespace detail

namespace {

struct FaultPlan {
    bool armed = false;
    bool sticky = false;
    std::uint32_t nth = 0;
    long nativeError = 0;
    std::uint32_t calls = 0;
};

std::mutex gMutex;
FaultPlan gPlans[kFaultKindCount];

FaultPlan& PlanOf(FaultKind kind) {
    return gPlans[static_cast<int>(kind)];
}

/// Keeps the fast path's flag in step with the plans; called with the mutex held.
void UpdateArmedFlag() {
    bool any = false;
    for (FaultPlan const& plan : gPlans)
        any = any || plan.armed;
    detail::gAnyFaultArmed.store(any, std::memory_order_relaxed);
}

} // namespace

void ArmFault(FaultKind kind, std::uint32_t nth, long nativeError, bool sticky) {
    std::lock_guard<std::mutex> const lock(gMutex);
    PlanOf(kind) = FaultPlan{true, sticky, nth, nativeError, 0};
    UpdateArmedFlag();
}

void DisarmFault(FaultKind kind) {
    std::lock_guard<std::mutex> const lock(gMutex);
    PlanOf(kind).armed = false;
    UpdateArmedFlag();
}

void DisarmAllFaults() {
    std::lock_guard<std::mutex> const lock(gMutex);
    for (FaultPlan& plan : gPlans)
        plan.armed = false;
    UpdateArmedFlag();
}

std::uint32_t FaultCallCount(FaultKind kind) {
    std::lock_guard<std::mutex> const lock(gMutex);
    return PlanOf(kind).calls;
}

SystemError detail::TakeFault(FaultKind kind, char const* apiFunction) {
    std::lock_guard<std::mutex> const lock(gMutex);
    FaultPlan& plan = PlanOf(kind);
    if (!plan.armed)
        return {};
    std::uint32_t const call = ++plan.calls;
    bool const fails = plan.nth != 0 && (call == plan.nth || (plan.sticky && call > plan.nth));
    return fails ? SystemError{apiFunction, plan.nativeError} : SystemError{};
}

} // namespace tekit::platform

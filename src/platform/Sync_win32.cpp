// Locking primitives on Windows: critical sections, mutex objects, Sleep(0).
#include "platform/Fault.h"
#include "platform/Sync.h"
#include "platform/Win32.h"

namespace tekit::platform {

static_assert(sizeof(CRITICAL_SECTION) <= kCriticalSectionSize &&
              alignof(CRITICAL_SECTION) <= kCriticalSectionAlign);
static_assert(kWaitAbandoned == WAIT_ABANDONED && kWaitTimeout == WAIT_TIMEOUT &&
              kWaitFailed == WAIT_FAILED && kWaitForever == INFINITE);

namespace {

CRITICAL_SECTION* AsSection(void* section) {
    return static_cast<CRITICAL_SECTION*>(section);
}

} // namespace

void InitializeCriticalSectionObject(void* section, std::uint32_t spinCount) {
    if (spinCount == 0)
        ::InitializeCriticalSection(AsSection(section));
    else
        ::InitializeCriticalSectionAndSpinCount(AsSection(section), spinCount);
}

void DeleteCriticalSectionObject(void* section) {
    ::DeleteCriticalSection(AsSection(section));
}

void EnterCriticalSectionObject(void* section) {
    ::EnterCriticalSection(AsSection(section));
}

bool TryEnterCriticalSectionObject(void* section) {
    return ::TryEnterCriticalSection(AsSection(section)) != FALSE;
}

void LeaveCriticalSectionObject(void* section) {
    ::LeaveCriticalSection(AsSection(section));
}

void YieldTimeSlice() {
    ::Sleep(0);
}

SystemError CreateNamedMutex(char const* name, NamedMutexHandle& handle) {
    if (SystemError const injected = InjectedFailure(FaultKind::Open, "CreateMutexA"))
        return injected;
    HANDLE const mutex = ::CreateMutexA(nullptr, FALSE, name != nullptr && *name ? name : nullptr);
    if (mutex == nullptr)
        return {"CreateMutexA", static_cast<long>(::GetLastError())};
    handle = mutex;
    return {};
}

std::uint32_t WaitForNamedMutex(NamedMutexHandle handle, std::uint32_t timeoutMs,
                                SystemError& error) {
    DWORD const result = ::WaitForSingleObject(handle, timeoutMs);
    if (result == WAIT_FAILED)
        error = {"WaitForSingleObject", static_cast<long>(::GetLastError())};
    return result;
}

void ReleaseNamedMutex(NamedMutexHandle handle) {
    ::ReleaseMutex(handle);
}

void CloseNamedMutex(NamedMutexHandle handle) {
    ::CloseHandle(handle);
}

} // namespace tekit::platform

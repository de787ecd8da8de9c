// The Windows implementation of platform/Event.h.
#include "platform/Event.h"
#include "platform/Win32.h"

#include <new>
#include <process.h>

namespace tekit::platform {

namespace {

struct ThreadStart {
    ThreadFunction function;
    void* argument;
};

unsigned __stdcall ThreadMain(void* raw) {
    ThreadStart const start = *static_cast<ThreadStart*>(raw);
    delete static_cast<ThreadStart*>(raw);
    return start.function(start.argument);
}

SystemError LastError(char const* api) {
    return {api, static_cast<long>(::GetLastError())};
}

} // namespace

SystemError CreateEventObject(bool manualReset, bool initiallySignalled, WaitableHandle& handle) {
    handle = ::CreateEventA(nullptr, manualReset, initiallySignalled, nullptr);
    return handle ? SystemError{} : LastError("CreateEventA");
}

void SetEventObject(WaitableHandle handle) {
    ::SetEvent(handle);
}

void ResetEventObject(WaitableHandle handle) {
    ::ResetEvent(handle);
}

std::uint32_t WaitForObject(WaitableHandle handle, std::uint32_t timeoutMs) {
    return ::WaitForSingleObject(handle, timeoutMs);
}

SystemError DuplicateWaitable(WaitableHandle handle, WaitableHandle& copy) {
    HANDLE const process = ::GetCurrentProcess();
    if (!::DuplicateHandle(process, handle, process, &copy, 0, FALSE, DUPLICATE_SAME_ACCESS)) {
        copy = nullptr;
        return LastError("DuplicateHandle");
    }
    return {};
}

void CloseWaitable(WaitableHandle handle) {
    if (handle != nullptr)
        ::CloseHandle(handle);
}

SystemError StartThread(ThreadFunction function, void* argument, WaitableHandle& handle) {
    // _beginthreadex, not CreateThread: the thread uses the C runtime.
    auto* start = new (std::nothrow) ThreadStart{function, argument};
    if (start == nullptr)
        return {"_beginthreadex", ERROR_NOT_ENOUGH_MEMORY};
    handle = reinterpret_cast<HANDLE>(::_beginthreadex(nullptr, 0, ThreadMain, start, 0, nullptr));
    if (handle == nullptr) {
        delete start;
        return {"_beginthreadex", static_cast<long>(::GetLastError())};
    }
    return {};
}

void NameCurrentThread(char const* name) {
    // SetThreadDescription exists from Windows 10 1607 on: looked up, not linked.
    using SetDescription = HRESULT(WINAPI*)(HANDLE, PCWSTR);
    static auto const setDescription = reinterpret_cast<SetDescription>(reinterpret_cast<void*>(
        ::GetProcAddress(::GetModuleHandleA("kernel32.dll"), "SetThreadDescription")));
    if (setDescription == nullptr)
        return;
    wchar_t wide[64] = {};
    for (int i = 0; i < 63 && name[i] != '\0'; ++i)
        wide[i] = static_cast<unsigned char>(name[i]);
    setDescription(::GetCurrentThread(), wide);
}

} // namespace tekit::platform

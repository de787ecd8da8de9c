// The POSIX implementation of platform/MessageLoop.h.
#include "platform/MessageLoop.h"

#include <pthread.h>

namespace tekit::platform {

// No thread of a POSIX process owns windows: what follows is the honest empty answer to each
// question, with a real per-thread slot so the generic code runs unchanged.

SystemError AllocateThreadSlot(std::uint32_t& slot) {
    pthread_key_t key{};
    if (int const error = ::pthread_key_create(&key, nullptr)) {
        slot = kNoThreadSlot;
        return {"pthread_key_create", error};
    }
    slot = static_cast<std::uint32_t>(key);
    return {};
}

void FreeThreadSlot(std::uint32_t slot) {
    ::pthread_key_delete(static_cast<pthread_key_t>(slot));
}

std::uintptr_t ThreadSlotValue(std::uint32_t slot) {
    return reinterpret_cast<std::uintptr_t>(
        ::pthread_getspecific(static_cast<pthread_key_t>(slot)));
}

void SetThreadSlotValue(std::uint32_t slot, std::uintptr_t value) {
    ::pthread_setspecific(static_cast<pthread_key_t>(slot), reinterpret_cast<void*>(value));
}

SystemError InstallWindowEventHook(void*, WindowEventHandler, void*& hook) {
    static char token; // no window ever exists to report on
    hook = &token;
    return {};
}

void RemoveWindowEventHook(void*) {}

void EnumerateThreadWindows(WindowVisitor, void*) {}

void WindowClassName(WindowHandle, char (&name)[256]) {
    name[0] = '\0';
}

WindowHandle NextMessageOnlyWindow(WindowHandle) {
    return nullptr;
}

bool WindowBelongsToCallingThread(WindowHandle) {
    return false;
}

bool PeekAndDispatchOne(WindowHandle, unsigned, unsigned, PeekFlags) {
    return false;
}

std::uint32_t WaitForObjectOrInput(WaitableHandle handle, std::uint32_t timeoutMs) {
    return WaitForObject(handle, timeoutMs);
}

} // namespace tekit::platform

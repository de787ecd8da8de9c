// The Windows implementation of platform/MessageLoop.h.
#include "platform/MessageLoop.h"
#include "platform/Win32.h"

#include <atomic>

namespace tekit::platform {

namespace {

std::atomic<WindowEventHandler> gWindowEventHandler{nullptr};

void CALLBACK OnWindowEvent(HWINEVENTHOOK, DWORD event, HWND window, LONG object, LONG child, DWORD,
                            DWORD) {
    // Only the window itself: its caret, cursor or children report with the same handle.
    if (window == nullptr || object != OBJID_WINDOW || child != CHILDID_SELF)
        return;
    if (WindowEventHandler const handler = gWindowEventHandler.load(std::memory_order_acquire))
        handler(window, event == EVENT_OBJECT_CREATE);
}

HMODULE ModuleOfThisCode() {
    HMODULE module = nullptr;
    ::GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS |
                             GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                         reinterpret_cast<LPCSTR>(&OnWindowEvent), &module);
    return module;
}

struct Visit {
    WindowVisitor visitor;
    void* context;
};

BOOL CALLBACK VisitWindow(HWND window, LPARAM raw) {
    auto const* visit = reinterpret_cast<Visit const*>(raw);
    visit->visitor(window, visit->context);
    return TRUE; // every enumeration goes on to the next window
}

} // namespace

SystemError AllocateThreadSlot(std::uint32_t& slot) {
    slot = ::TlsAlloc();
    return slot == TLS_OUT_OF_INDEXES ? SystemError{"TlsAlloc", static_cast<long>(::GetLastError())}
                                      : SystemError{};
}

void FreeThreadSlot(std::uint32_t slot) {
    ::TlsFree(slot);
}

std::uintptr_t ThreadSlotValue(std::uint32_t slot) {
    return reinterpret_cast<std::uintptr_t>(::TlsGetValue(slot));
}

void SetThreadSlotValue(std::uint32_t slot, std::uintptr_t value) {
    ::TlsSetValue(slot, reinterpret_cast<void*>(value));
}

SystemError InstallWindowEventHook(void* module, WindowEventHandler handler, void*& hook) {
    gWindowEventHandler.store(handler, std::memory_order_release);
    HMODULE const owner = module ? static_cast<HMODULE>(module) : ModuleOfThisCode();
    hook = ::SetWinEventHook(EVENT_OBJECT_CREATE, EVENT_OBJECT_DESTROY, owner, OnWindowEvent,
                             ::GetCurrentProcessId(), 0, WINEVENT_INCONTEXT);
    return hook ? SystemError{}
                : SystemError{"SetWinEventHook", static_cast<long>(::GetLastError())};
}

void RemoveWindowEventHook(void* hook) {
    if (hook != nullptr)
        ::UnhookWinEvent(static_cast<HWINEVENTHOOK>(hook));
}

void EnumerateThreadWindows(WindowVisitor visitor, void* context) {
    Visit visit{visitor, context};
    ::EnumThreadWindows(::GetCurrentThreadId(), VisitWindow, reinterpret_cast<LPARAM>(&visit));
}

void WindowClassName(WindowHandle window, char (&name)[256]) {
    if (::GetClassNameA(static_cast<HWND>(window), name, 256) <= 0)
        name[0] = '\0';
}

WindowHandle NextMessageOnlyWindow(WindowHandle after) {
    return ::FindWindowExA(HWND_MESSAGE, static_cast<HWND>(after), nullptr, nullptr);
}

bool WindowBelongsToCallingThread(WindowHandle window) {
    return ::GetWindowThreadProcessId(static_cast<HWND>(window), nullptr) == ::GetCurrentThreadId();
}

bool PeekAndDispatchOne(WindowHandle window, unsigned first, unsigned last, PeekFlags flags) {
    UINT const remove =
        flags == PeekFlags::kRemove ? PM_REMOVE : PM_REMOVE | PM_QS_POSTMESSAGE | PM_QS_SENDMESSAGE;
    MSG message{};
    if (!::PeekMessageA(&message, static_cast<HWND>(window), first, last, remove))
        return false;
    ::TranslateMessage(&message);
    ::DispatchMessageA(&message);
    return true;
}

std::uint32_t WaitForObjectOrInput(WaitableHandle handle, std::uint32_t timeoutMs) {
    HANDLE handles[1] = {handle};
    return ::MsgWaitForMultipleObjects(1, handles, FALSE, timeoutMs, QS_ALLINPUT);
}

} // namespace tekit::platform

// The calling thread's windows and messages, as the UI-aware waits see them: a per-thread
// slot, a window-event hook for windows being created and destroyed, the thread's top-level
// and message-only windows, and removing and dispatching messages.
//
//   std::uint32_t slot;
//   if (!AllocateThreadSlot(slot)) ...
//   EnumerateThreadWindows([](WindowHandle w, void* c) { ... }, &context);
//   while (PeekAndDispatchOne(w, 0x400, 0x7FFF, PeekFlags::kRemovePostedAndSent)) ...
//
// On Windows these are TlsAlloc, SetWinEventHook, EnumThreadWindows, GetClassNameA,
// FindWindowExA under HWND_MESSAGE, PeekMessageA / TranslateMessage / DispatchMessageA and
// MsgWaitForMultipleObjects. Elsewhere a thread has no windows: the slot is a pthread key, the
// hook is accepted and never called, enumerations find nothing, nothing is ever pending, and a
// message wait is a plain timed wait.
#pragma once

#include "platform/Event.h"
#include "platform/SystemError.h"

#include <cstdint>

namespace tekit::platform {

/// An HWND.
using WindowHandle = void*;

// ---- A per-thread slot --------------------------------------------------------------------
inline constexpr std::uint32_t kNoThreadSlot = 0xFFFFFFFF; // TLS_OUT_OF_INDEXES
SystemError AllocateThreadSlot(std::uint32_t& slot);
void FreeThreadSlot(std::uint32_t slot);
/// 0 until the calling thread stores something.
std::uintptr_t ThreadSlotValue(std::uint32_t slot);
void SetThreadSlotValue(std::uint32_t slot, std::uintptr_t value);

// ---- Windows being created and destroyed --------------------------------------------------
/// Called on the thread that creates (`created` true) or destroys a window.
using WindowEventHandler = void (*)(WindowHandle window, bool created);
/// Hooks object creation and destruction of windows, in-context, for every thread of the
/// process. `module` is the module that holds the handler (null: the one holding this code).
SystemError InstallWindowEventHook(void* module, WindowEventHandler handler, void*& hook);
void RemoveWindowEventHook(void* hook);

// ---- The calling thread's windows ----------------------------------------------------------
using WindowVisitor = void (*)(WindowHandle window, void* context);
/// Visits every top-level window of the calling thread.
void EnumerateThreadWindows(WindowVisitor visitor, void* context);
/// The window's class name (GetClassNameA into 256 bytes); empty when it has none.
void WindowClassName(WindowHandle window, char (&name)[256]);
/// The message-only window after `after` (null: the first), or null at the end.
WindowHandle NextMessageOnlyWindow(WindowHandle after);
bool WindowBelongsToCallingThread(WindowHandle window);

// ---- Messages -------------------------------------------------------------------------------
enum class PeekFlags {
    kRemove,              ///< PM_REMOVE
    kRemovePostedAndSent, ///< PM_REMOVE | PM_QS_POSTMESSAGE | PM_QS_SENDMESSAGE
};
/// Removes one pending message of the calling thread for `window` (null: any window) with a
/// number in [first, last] (0, 0: any), translates and dispatches it; false when none is
/// pending.
bool PeekAndDispatchOne(WindowHandle window, unsigned first, unsigned last, PeekFlags flags);
/// MsgWaitForMultipleObjects(1, &handle, FALSE, timeoutMs, QS_ALLINPUT): kWaitObject0 + 1 when
/// input arrived first.
std::uint32_t WaitForObjectOrInput(WaitableHandle handle, std::uint32_t timeoutMs);

} // namespace tekit::platform

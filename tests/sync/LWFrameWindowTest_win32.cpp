// UI threads with real windows: the hook counts frame windows as they come and go, and a UI
// thread that waits for a lock or a handle keeps serving its frames (a non-UI thread does not).
// Windows only; under Wine these run on an Xvfb display.
#if defined(_WIN32)

#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/MessageLoopWaits.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <iterator>
#include <thread>

namespace tekit {
namespace {

using Detection = LWAwareCriticalSectionImplementation;

constexpr char kFrameClass[] = "LWFrame";
constexpr char kFrameClassOtherCase[] = "lwframe"; // the same class: class names ignore case
constexpr char kPlainClass[] = "TekitPlainWindow";

/// The messages a test posts; the window procedure records message i as bit 1 << i.
constexpr UINT kProbes[] = {
    0x308,       // WM_DRAWCLIPBOARD, in the clipboard range
    WM_USER + 7, // the application range
    WM_TIMER,
    WM_APP + 1, // outside every range of the frame pump
};
constexpr unsigned kClipboardBit = 1, kFrameBits = 1 | 2 | 4, kAppBit = 8;

LRESULT CALLBACK RecordingProcedure(HWND window, UINT message, WPARAM w, LPARAM l) {
    auto* seen =
        reinterpret_cast<std::atomic<unsigned>*>(::GetWindowLongPtrA(window, GWLP_USERDATA));
    for (unsigned i = 0; i < std::size(kProbes); ++i)
        if (seen != nullptr && message == kProbes[i]) {
            seen->fetch_or(1u << i);
            return 0;
        }
    return ::DefWindowProcA(window, message, w, l);
}

HWND CreateRecordedWindow(char const* className, std::atomic<unsigned>* seen) {
    static bool const registered = [] {
        for (char const* name : {kFrameClass, kPlainClass}) {
            WNDCLASSA c{};
            c.lpfnWndProc = RecordingProcedure;
            c.hInstance = ::GetModuleHandleA(nullptr);
            c.lpszClassName = name;
            ::RegisterClassA(&c);
        }
        return true;
    }();
    HWND const window = ::CreateWindowExA(0, className, "", WS_OVERLAPPEDWINDOW, 0, 0, 100, 100,
                                          nullptr, nullptr, ::GetModuleHandleA(nullptr), nullptr);
    if (window != nullptr && registered)
        ::SetWindowLongPtrA(window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(seen));
    return window;
}

bool WaitUntil(std::function<bool()> const& done, int milliseconds) {
    auto const until = std::chrono::steady_clock::now() + std::chrono::milliseconds(milliseconds);
    while (!done()) {
        if (std::chrono::steady_clock::now() > until)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
    return true;
}

class FrameWindowTest : public ::testing::Test {
protected:
    void SetUp() override { Detection::InitializeLWUIThreadDetectionHooks(); }
    void TearDown() override { Detection::CleanupLWUIThreadDetectionHooks(); }
};

/// Destroys a frame window. Wine reports the creation of windows to event hooks but not their
/// destruction: under Wine the test raises the event that Windows raises inside DestroyWindow,
/// so the hook's own handling of it is checked there too.
void DestroyFrame(HWND window) {
    HMODULE const ntdll = ::GetModuleHandleA("ntdll.dll");
    if (ntdll != nullptr && ::GetProcAddress(ntdll, "wine_get_version") != nullptr)
        ::NotifyWinEvent(EVENT_OBJECT_DESTROY, window, OBJID_WINDOW, CHILDID_SELF);
    ::DestroyWindow(window);
}

// A thread is examined by its windows when first asked, then the hook counts its frames as they
// come and go; without the hooks no thread is a UI thread, and new hooks examine it again.
TEST_F(FrameWindowTest, HookFollowsFrameWindowsAsTheyAreCreatedAndDestroyed) {
    std::thread([] {
        EXPECT_FALSE(Detection::CurrentThreadIsLWUIThread()); // examined now: no frames
        std::atomic<unsigned> seen{0};
        HWND const plain = CreateRecordedWindow(kPlainClass, &seen);
        EXPECT_FALSE(Detection::CurrentThreadIsLWUIThread());
        HWND const first = CreateRecordedWindow(kFrameClass, &seen);
        HWND const second = CreateRecordedWindow(kFrameClassOtherCase, &seen);
        ASSERT_TRUE(first && second && plain);
        EXPECT_TRUE(Detection::IsLWFrameWindow(first));
        EXPECT_FALSE(Detection::IsLWFrameWindow(plain));
        EXPECT_TRUE(Detection::CurrentThreadIsLWUIThread()); // counted by the hook
        Detection::CleanupLWUIThreadDetectionHooks();
        EXPECT_FALSE(Detection::CurrentThreadIsLWUIThread());
        Detection::InitializeLWUIThreadDetectionHooks();
        EXPECT_TRUE(Detection::CurrentThreadIsLWUIThread()); // a fresh slot: enumerated again
        DestroyFrame(first);
        EXPECT_TRUE(Detection::CurrentThreadIsLWUIThread()); // one frame is left
        DestroyFrame(second);
        EXPECT_FALSE(Detection::CurrentThreadIsLWUIThread());
        ::DestroyWindow(plain);
    }).join();
}

/// How a window thread waits while the main thread holds what it waits for, and the probes
/// that the wait must dispatch on a UI thread and on another thread.
struct WaitKind {
    char const* name;
    unsigned onUIThread, otherwise;
};
constexpr WaitKind kWaitKinds[] = {
    {"reader-writer lock", kFrameBits, 0},
    {"event-based lock", kFrameBits, 0},
    {"LWUISafe wait", kFrameBits, 0},
    {"limited message loop", kFrameBits, kClipboardBit}, // clipboard for every window
    {"message loop", kFrameBits | kAppBit, kFrameBits | kAppBit},
};

/// What the main thread holds and the window thread waits for.
struct Blocker {
    LWAwareCriticalSection rwLock;
    LWAwareCriticalSectionImplementation eventLock;
    HANDLE event = ::CreateEventA(nullptr, TRUE, FALSE, nullptr);

    Blocker() {
        rwLock.Lock(kExclusiveAccess, 0);
        eventLock.Lock(kExclusiveAccess, 0);
    }
    ~Blocker() { ::CloseHandle(event); }
    void Wait(int kind) {
        if (kind < 2) {
            Lockable& lock = kind == 0 ? static_cast<Lockable&>(rwLock) : eventLock;
            lock.Lock(kExclusiveAccess, 0);
            lock.Unlock(kExclusiveAccess);
            return;
        }
        DWORD const result = kind == 2   ? TEWaitForSingleObject_LWUISafe(event, INFINITE)
                             : kind == 3 ? TEWaitInLimitedMessageLoop(event, INFINITE)
                                         : TEWaitInMessageLoop(event, INFINITE, 5);
        EXPECT_EQ(result, WAIT_OBJECT_0);
    }
    void Release() {
        rwLock.Unlock(kExclusiveAccess);
        eventLock.Unlock(kExclusiveAccess);
        ::SetEvent(event);
    }
};

TEST_F(FrameWindowTest, WaitingUIThreadServesItsFramesAndOtherThreadsDoNot) {
    for (int kind = 0; kind < 5; ++kind) {
        WaitKind const& k = kWaitKinds[kind];
        for (bool const uiThread : {true, false}) {
            SCOPED_TRACE(std::string(k.name) + (uiThread ? " on a UI thread" : " elsewhere"));
            unsigned const expected = uiThread ? k.onUIThread : k.otherwise;
            Blocker blocker;
            std::atomic<unsigned> seen{0};
            std::atomic<bool> waiting{false};
            std::thread windowThread([&] {
                HWND const window =
                    CreateRecordedWindow(uiThread ? kFrameClass : kPlainClass, &seen);
                ASSERT_NE(window, nullptr);
                for (UINT message : kProbes)
                    ::PostMessageA(window, message, 1, 0);
                waiting = true;
                blocker.Wait(kind);
                ::DestroyWindow(window);
            });
            ASSERT_TRUE(WaitUntil([&] { return waiting.load(); }, 5000));
            // Served while the wait lasts: the main thread sees it before it lets go.
            bool const served = WaitUntil([&] { return (seen & expected) == expected; }, 5000);
            std::this_thread::sleep_for(std::chrono::milliseconds(100)); // time for strays
            unsigned const during = seen.load();
            blocker.Release();
            windowThread.join();
            EXPECT_TRUE(served) << "dispatched: " << during;
            EXPECT_EQ(during, expected);
        }
    }
}

} // namespace
} // namespace tekit

#endif

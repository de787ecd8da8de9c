// A small COM object for the interface-table tests: its reference count and the thread of its
// last release can be read, its queries can be told to fail, and its releases can be hooked.
#pragma once

#include "tekit/platform/WinTypes.h"

#include "platform/InterfaceTable.h"
#include "platform/Thread.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <thread>

#if defined(_WIN32)
#include <objbase.h>
#include <unknwn.h>
#define TEST_COM_CALL STDMETHODCALLTYPE
#else
#define TEST_COM_CALL
#endif

namespace tekit::testing {

/// The interface the tests register: IUnknown with nothing added, under an IID of its own.
inline GUID const kTestInterfaceId = {
    0x6d1f3a52, 0x2b7e, 0x4c1d, {0x9a, 0x31, 0x5e, 0x0b, 0x77, 0x12, 0xc4, 0x08}};

class CountedObject : public IUnknown {
public:
    /// Starts with one reference, the creator's. On Windows it aggregates the free-threaded
    /// marshaler, so the table hands the object itself to any thread of any apartment (no
    /// proxy/stub exists for the test interface).
    CountedObject() {
#if defined(_WIN32)
        if (FAILED(::CoCreateFreeThreadedMarshaler(this, &m_marshaler)))
            m_marshaler = nullptr;
#endif
    }
    ~CountedObject() {
        if (m_marshaler != nullptr)
            m_marshaler->Release();
    }
    CountedObject(CountedObject const&) = delete;
    CountedObject& operator=(CountedObject const&) = delete;

    HRESULT TEST_COM_CALL QueryInterface(REFIID iid, void** object) override {
        GUID const unknownId = {0, 0, 0, {0xC0, 0, 0, 0, 0, 0, 0, 0x46}}; // IID_IUnknown
        *object = nullptr;
        if (HRESULT const refusal = m_refusal.load())
            return refusal;
        if (iid == unknownId || iid == kTestInterfaceId) {
            *object = static_cast<IUnknown*>(this);
            AddRef();
            return 0;
        }
#if defined(_WIN32)
        if (m_marshaler != nullptr && iid == IID_IMarshal &&
            SUCCEEDED(m_marshaler->QueryInterface(iid, object)))
            return 0;
#endif
        return static_cast<HRESULT>(0x80004002); // E_NOINTERFACE
    }
    ULONG TEST_COM_CALL AddRef() override {
        return static_cast<ULONG>(++m_count);
    }
    /// The tests own the objects (on the stack or in containers): reaching 0 frees nothing.
    ULONG TEST_COM_CALL Release() override {
        if (onRelease)
            onRelease();
        m_lastReleaser.store(platform::CurrentThreadId());
        long const count = --m_count;
        if (count < 0)
            m_overReleased.store(true);
        return static_cast<ULONG>(count);
    }

    long Count() const {
        return m_count.load();
    }
    /// True once a release took the count below zero: something released twice.
    bool OverReleased() const {
        return m_overReleased.load();
    }
    /// The thread of the latest Release (tekit's thread identifier).
    std::uint32_t LastReleasingThread() const {
        return m_lastReleaser.load();
    }
    /// Queries fail with `hr` from now on (0: they succeed again).
    void RefuseQueries(HRESULT hr) {
        m_refusal.store(hr);
    }
    /// Runs first in every release, on the releasing thread.
    std::function<void()> onRelease;

private:
    std::atomic<long> m_count{1};
    std::atomic<bool> m_overReleased{false};
    std::atomic<std::uint32_t> m_lastReleaser{0};
    std::atomic<HRESULT> m_refusal{0};
    IUnknown* m_marshaler = nullptr; // Windows: the free-threaded marshaler it aggregates
};

/// The calling thread in COM's multithreaded apartment for a scope (nothing on Linux).
class ApartmentScope {
public:
    ApartmentScope() : m_entered(platform::EnterMultithreadedApartment() >= 0) {}
    ~ApartmentScope() {
        if (m_entered)
            platform::LeaveApartment();
    }
    ApartmentScope(ApartmentScope const&) = delete;
    ApartmentScope& operator=(ApartmentScope const&) = delete;

private:
    bool m_entered;
};

/// Runs `body` on a new thread of the multithreaded apartment and waits for it.
inline void OnOtherThread(std::function<void()> const& body) {
    std::thread([&] {
        ApartmentScope apartment;
        body();
    }).join();
}

} // namespace tekit::testing

// A small COM object for the interface-table tests: its reference count and the thread of its
// last release can be read, and its queries can be told to fail.
#pragma once

#include "tekit/platform/WinTypes.h"

#include <atomic>
#include <cstdint>

#if defined(_WIN32)
#include <unknwn.h>
#define TEST_COM_CALL STDMETHODCALLTYPE
#else
#define TEST_COM_CALL
#endif

namespace tekit::testing {

/// The interface the tests register: IUnknown with nothing added, under an IID of its own.
extern GUID const kTestInterfaceId;

class CountedObject : public IUnknown {
public:
    /// Starts with one reference, the creator's.
    CountedObject();
    ~CountedObject();
    CountedObject(CountedObject const&) = delete;
    CountedObject& operator=(CountedObject const&) = delete;

    HRESULT TEST_COM_CALL QueryInterface(REFIID iid, void** object) override;
    ULONG TEST_COM_CALL AddRef() override;
    ULONG TEST_COM_CALL Release() override;

    long Count() const { return m_count.load(); }
    /// True once a release took the count below zero: something released twice.
    bool OverReleased() const { return m_overReleased.load(); }
    /// The thread of the latest Release (tekit's thread identifier).
    std::uint32_t LastReleasingThread() const { return m_lastReleaser.load(); }
    /// Queries fail with `hr` from now on (0: they succeed again).
    void RefuseQueries(HRESULT hr) { m_refusal.store(hr); }
    /// Every release first waits (up to 5 s) until `gate` is true, and sets `entered`.
    void BlockReleasesOn(std::atomic<bool>* gate, std::atomic<bool>* entered) {
        m_gate = gate;
        m_entered = entered;
    }

    /// Every release sets `gate` to true once it is done.
    void OpenOnRelease(std::atomic<bool>* gate) { m_opens = gate; }

private:
    std::atomic<long> m_count{1};
    std::atomic<bool> m_overReleased{false};
    std::atomic<std::uint32_t> m_lastReleaser{0};
    std::atomic<HRESULT> m_refusal{0};
    std::atomic<bool>* m_gate = nullptr;
    std::atomic<bool>* m_entered = nullptr;
    std::atomic<bool>* m_opens = nullptr;
    IUnknown* m_marshaler = nullptr; // Windows: the free-threaded marshaler it aggregates
};

/// The calling thread in COM's multithreaded apartment for a scope (nothing on Linux).
class ApartmentScope {
public:
    ApartmentScope();
    ~ApartmentScope();
    ApartmentScope(ApartmentScope const&) = delete;
    ApartmentScope& operator=(ApartmentScope const&) = delete;

private:
    bool m_entered;
};

} // namespace tekit::testing

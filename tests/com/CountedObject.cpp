#include "CountedObject.h"

#include "platform/InterfaceTable.h"
#include "platform/Thread.h"

#include <chrono>
#include <thread>

#if defined(_WIN32)
#include <objbase.h>
#endif

namespace tekit::testing {

#if !defined(_WIN32)
inline constexpr HRESULT E_NOINTERFACE = static_cast<HRESULT>(0x80004002);
#endif

GUID const kTestInterfaceId = {
    0x6d1f3a52, 0x2b7e, 0x4c1d, {0x9a, 0x31, 0x5e, 0x0b, 0x77, 0x12, 0xc4, 0x08}};

namespace {
GUID const kUnknownId = {0, 0, 0, {0xC0, 0, 0, 0, 0, 0, 0, 0x46}}; // IID_IUnknown
} // namespace

// On Windows the object aggregates the free-threaded marshaler, so the table hands the object
// itself to any thread of any apartment (no proxy/stub exists for the test interface).
CountedObject::CountedObject() {
#if defined(_WIN32)
    if (FAILED(::CoCreateFreeThreadedMarshaler(this, &m_marshaler)))
        m_marshaler = nullptr;
#endif
}

CountedObject::~CountedObject() {
    if (m_marshaler != nullptr)
        m_marshaler->Release();
}

HRESULT CountedObject::QueryInterface(REFIID iid, void** object) {
    *object = nullptr;
    if (HRESULT const refusal = m_refusal.load())
        return refusal;
    if (iid == kUnknownId || iid == kTestInterfaceId) {
        *object = static_cast<IUnknown*>(this);
        AddRef();
        return 0;
    }
#if defined(_WIN32)
    if (m_marshaler != nullptr && iid == IID_IMarshal &&
        SUCCEEDED(m_marshaler->QueryInterface(iid, object)))
        return 0;
#endif
    return E_NOINTERFACE;
}

ULONG CountedObject::AddRef() {
    return static_cast<ULONG>(++m_count);
}

ULONG CountedObject::Release() {
    if (m_gate != nullptr) {
        if (m_entered != nullptr)
            m_entered->store(true);
        auto const until = std::chrono::steady_clock::now() + std::chrono::seconds(5);
        while (!m_gate->load() && std::chrono::steady_clock::now() < until)
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    m_lastReleaser.store(platform::CurrentThreadId());
    long const count = --m_count;
    if (count < 0)
        m_overReleased.store(true);
    if (m_opens != nullptr)
        m_opens->store(true);
    // The tests own the objects (on the stack or in vectors): reaching 0 frees nothing.
    return static_cast<ULONG>(count);
}

ApartmentScope::ApartmentScope() : m_entered(platform::EnterMultithreadedApartment() >= 0) {}

ApartmentScope::~ApartmentScope() {
    if (m_entered)
        platform::LeaveApartment();
}

} // namespace tekit::testing

// One COM interface kept in the process's global interface table, handed out valid in
// whichever thread asks.
//
//   OVGlobalInterfacePointer holder(engine, IID_IEngine, DynamicString("IEngine"), true,
//                                   false, false);
//   // ... on any thread:
//   bool addRefDone = false;
//   auto* engine = static_cast<IEngine*>(holder.GetLocalInterface(true, &addRefDone));
//   ...
//   if (addRefDone) engine->Release();
//
// An optimized holder also keeps the raw pointer for the registering thread, which then gets
// it without a trip through the table. On Linux the table is an in-process one (no
// apartments, no marshalling); the holder's logic is the same.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/sync/CriticalSections.h"
#include "tekit/sync/LWAwareCriticalSection.h"

#include <cstdint>

struct IUnknown;

namespace tekit {

class String;

class TEKIT_API OVGlobalInterfacePointer {
public:
    /// Registers `object` when it is not null. Raises TE_UNEXPECTED_SYSTEM_ERROR when COM
    /// refuses.
    OVGlobalInterfacePointer(IUnknown* object, GUID const& iid, String const& iidName,
                             bool optimized, bool isDispatch, bool isDotNetObjectHolder);
    /// Unregisters; a failure is written to the debug output, never raised.
    ~OVGlobalInterfacePointer();
    OVGlobalInterfacePointer(OVGlobalInterfacePointer const&) = delete;
    OVGlobalInterfacePointer& operator=(OVGlobalInterfacePointer const&) = delete;

    /// Registers `object` in the table (unregistering what was held first). `optimized`
    /// keeps the pointer, with a reference of its own, for the calling thread.
    void RegisterInterface(IUnknown* object, GUID const& iid, String const& iidName,
                           bool optimized);
    /// Revokes the registration and drops the kept pointer; must run on the registering
    /// thread when the holder is optimized.
    void UnregisterInterface();
    /// The interface, valid in the calling thread, or null when nothing is registered.
    /// `*addRefDone` tells whether the caller must release it: always after a fetch from the
    /// table, and for the kept pointer only when `addRef` asked for it.
    void* GetLocalInterface(bool addRef, bool* addRefDone);

    bool GetOptimized();
    bool InRegisteredThread();
    GUID GetIID();
    DynamicString GetIIDName();
    bool IsDispatch() const { return m_isDispatch; }
    bool IsDotNetObjectHolder() const { return m_isDotNetObjectHolder; }

    /// Releases the process's table; the next registration creates it again.
    static void ReleaseGlobalRefToGIT();

    /// Guards the creation and release of the table.
    static LWAwareCriticalSection g_GITCrit;

private:
    static void InitializeGIT();
    /// Raises unless the caller is the registering thread.
    void ValidateObject();
    void UnregisterLocked();

    OSCriticalSection m_crit;
    std::uint32_t m_cookie = 0;
    bool m_registered = false;
    GUID m_iid{};
    DynamicString m_iidName;
    IUnknown* m_localPointer = nullptr;
    std::uint32_t m_registeringThread = 0;
    bool m_isDispatch = false;
    bool m_isDotNetObjectHolder = false;

    static void* g_pGIT;
};

} // namespace tekit

// OVGlobalInterfacePointer: one interface in the process's global interface table. Raise
// sites here report the file as "GlobalInterfacePointer".
#include "tekit/com/GlobalInterfacePointer.h"

#include "tekit/errors/DebugOutput.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEError.h"

#include "platform/InterfaceTable.h"
#include "platform/SystemError.h"
#include "platform/Thread.h"

#include <cstdio>

namespace tekit {

namespace {

constexpr long kObjectNotConnected = static_cast<std::int32_t>(0x800401FD); // CO_E_OBJNOTCONNECTED

bool Failed(long hr) {
    return hr < 0;
}

/// Holds a lock for a scope.
class Hold {
public:
    explicit Hold(Lockable& lock) : m_lock(lock) { m_lock.Lock(kExclusiveAccess, 0); }
    ~Hold() { m_lock.Unlock(kExclusiveAccess); }
    Hold(Hold const&) = delete;
    Hold& operator=(Hold const&) = delete;

private:
    Lockable& m_lock;
};

[[noreturn]] void RaiseComFailure(char const* function, char const* apiFunction, long hr) {
    TE_RAISE_API(TE_UNEXPECTED_SYSTEM_ERROR, static_cast<char const*>(nullptr), function,
                 apiFunction, hr);
}

/// Why a fetch from the table failed, in the user's language.
DynamicString FetchFailureText(long hr) {
    if (hr == kObjectNotConnected)
        return DynamicString(RString("ERR_DESCR", "ERR_MIGHT_INVOLVE_LONG_BREAKPOINT_IN_VC"));
    DynamicString text(RString("ERR_DESCR", "ERR_MIGHT_INVOLVE_MARSHALING"));
    std::string const system = platform::SystemErrorMessage(static_cast<unsigned>(hr));
    if (!system.empty()) {
        text += " ";
        text += system.c_str();
    }
    return text;
}

} // namespace

void* OVGlobalInterfacePointer::g_pGIT = nullptr;
LWAwareCriticalSection OVGlobalInterfacePointer::g_GITCrit;

OVGlobalInterfacePointer::OVGlobalInterfacePointer(IUnknown* object, GUID const& iid,
                                                   String const& iidName, bool optimized,
                                                   bool isDispatch, bool isDotNetObjectHolder)
    : m_iid(iid), m_iidName(iidName), m_isDispatch(isDispatch),
      m_isDotNetObjectHolder(isDotNetObjectHolder) {
    if (object != nullptr)
        RegisterInterface(object, iid, iidName, optimized);
}

OVGlobalInterfacePointer::~OVGlobalInterfacePointer() {
    try {
        UnregisterInterface();
    } catch (...) {
        char text[512];
        std::snprintf(text, sizeof text, "Error: ~OVGlobalInterfacePointer returning unknown %s.\n",
                      m_iidName.GetBufferReadPtr());
        WriteToCDebug(text);
    }
}

void OVGlobalInterfacePointer::InitializeGIT() {
    Hold hold(g_GITCrit);
    if (g_pGIT != nullptr)
        return;
    if (long const hr = platform::CreateInterfaceTable(g_pGIT); Failed(hr))
        RaiseComFailure("OVGlobalInterfacePointer::InitializeGIT", "CoCreateInstance", hr);
}

void OVGlobalInterfacePointer::ReleaseGlobalRefToGIT() {
    Hold hold(g_GITCrit);
    platform::ReleaseInterfaceTable(g_pGIT);
    g_pGIT = nullptr;
}

void OVGlobalInterfacePointer::RegisterInterface(IUnknown* object, GUID const& iid,
                                                 String const& iidName, bool optimized) {
    Hold hold(m_crit);
    if (m_registered)
        UnregisterLocked();
    InitializeGIT();
    std::uint32_t cookie = 0;
    if (long const hr = platform::RegisterInterfaceInTable(g_pGIT, object, iid, cookie); Failed(hr))
        RaiseComFailure("OVGlobalInterfacePointer::RegisterInterface", "RegisterInterfaceInGlobal",
                        hr);
    m_cookie = cookie;
    m_iid = iid;
    m_registered = true;
    m_registeringThread = platform::CurrentThreadId();
    if (optimized) {
        m_localPointer = object;
        platform::AddRefInterface(object);
    }
    m_iidName = iidName;
}

void OVGlobalInterfacePointer::UnregisterInterface() {
    Hold hold(m_crit);
    UnregisterLocked();
}

void OVGlobalInterfacePointer::UnregisterLocked() {
    if (m_registered) {
        if (long const hr = platform::RevokeInterfaceFromTable(g_pGIT, m_cookie); Failed(hr))
            RaiseComFailure("OVGlobalInterfacePointer::UnregisterInterface",
                            "RevokeInterfaceFromGlobal", hr);
        // Forgotten at once: after a refused release of the kept pointer below, the
        // registering thread can still drop it without revoking a stale cookie.
        m_cookie = 0;
        m_registered = false;
    }
    if (m_localPointer != nullptr) {
        ValidateObject(); // the kept pointer is valid on the registering thread only
        platform::ReleaseInterface(m_localPointer);
    }
    m_localPointer = nullptr;
    m_registeringThread = 0;
}

void* OVGlobalInterfacePointer::GetLocalInterface(bool addRef, bool* addRefDone) {
    Hold hold(m_crit);
    if (addRefDone != nullptr)
        *addRefDone = false;
    if (!m_registered)
        return nullptr;
    if (m_localPointer != nullptr && InRegisteredThread()) {
        if (addRef) {
            platform::AddRefInterface(m_localPointer);
            if (addRefDone != nullptr)
                *addRefDone = true;
        }
        return m_localPointer;
    }
    void* local = nullptr;
    if (long const hr = platform::GetInterfaceFromTable(g_pGIT, m_cookie, m_iid, &local);
        Failed(hr))
        TE_RAISE_API(TE_UNEXPECTED_SYSTEM_ERROR, FetchFailureText(hr),
                     "OVGlobalInterfacePointer::GetLocalInterface", "GetInterfaceFromGlobal", hr);
    if (addRefDone != nullptr)
        *addRefDone = true; // a fetch from the table always adds a reference
    return local;
}

void OVGlobalInterfacePointer::ValidateObject() {
    if (!InRegisteredThread())
        TE_RAISE(TE_UNEXPECTED_SYSTEM_ERROR,
                 "The interface's kept pointer is released on a thread other than the one that "
                 "registered it.",
                 "OVGlobalInterfacePointer::ValidateObject");
}

bool OVGlobalInterfacePointer::GetOptimized() {
    Hold hold(m_crit);
    return m_localPointer != nullptr;
}

bool OVGlobalInterfacePointer::InRegisteredThread() {
    return m_registeringThread == platform::CurrentThreadId();
}

GUID OVGlobalInterfacePointer::GetIID() {
    Hold hold(m_crit);
    return m_iid;
}

DynamicString OVGlobalInterfacePointer::GetIIDName() {
    Hold hold(m_crit);
    return m_iidName;
}

} // namespace tekit

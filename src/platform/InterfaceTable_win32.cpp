// The Windows implementation of platform/InterfaceTable.h.
#include "platform/InterfaceTable.h"
#include "platform/Win32.h"

#include <objbase.h>

namespace tekit::platform {

namespace {
IGlobalInterfaceTable* AsTable(InterfaceTableHandle table) {
    return static_cast<IGlobalInterfaceTable*>(table);
}
} // namespace

long CreateInterfaceTable(InterfaceTableHandle& table) {
    IGlobalInterfaceTable* git = nullptr;
    HRESULT const hr =
        ::CoCreateInstance(CLSID_StdGlobalInterfaceTable, nullptr, CLSCTX_INPROC_SERVER,
                           IID_IGlobalInterfaceTable, reinterpret_cast<void**>(&git));
    table = SUCCEEDED(hr) ? git : nullptr;
    return hr;
}

void ReleaseInterfaceTable(InterfaceTableHandle table) {
    if (table != nullptr)
        AsTable(table)->Release();
}

long RegisterInterfaceInTable(InterfaceTableHandle table, IUnknown* object, GUID const& iid,
                              std::uint32_t& cookie) {
    DWORD value = 0;
    HRESULT const hr = AsTable(table)->RegisterInterfaceInGlobal(object, iid, &value);
    cookie = value;
    return hr;
}

long RevokeInterfaceFromTable(InterfaceTableHandle table, std::uint32_t cookie) {
    return AsTable(table)->RevokeInterfaceFromGlobal(cookie);
}

long GetInterfaceFromTable(InterfaceTableHandle table, std::uint32_t cookie, GUID const& iid,
                           void** object) {
    return AsTable(table)->GetInterfaceFromGlobal(cookie, iid, object);
}

void AddRefInterface(IUnknown* object) {
    object->AddRef();
}

void ReleaseInterface(IUnknown* object) {
    object->Release();
}

long EnterMultithreadedApartment() {
    return ::CoInitializeEx(nullptr, COINIT_MULTITHREADED);
}

void LeaveApartment() {
    ::CoUninitialize();
}

} // namespace tekit::platform

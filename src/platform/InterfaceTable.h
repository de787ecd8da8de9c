// The process's global interface table: interfaces registered by one thread and obtained,
// valid, by any other, each under a 32-bit cookie. And the calling thread's COM apartment.
//
//   InterfaceTableHandle table = nullptr;
//   if (FAILED(CreateInterfaceTable(table))) ...
//   std::uint32_t cookie = 0;
//   RegisterInterfaceInTable(table, object, iid, cookie);   // adds a reference
//   GetInterfaceFromTable(table, cookie, iid, &pointer);      // adds a reference
//   RevokeInterfaceFromTable(table, cookie);                  // drops the table's reference
//
// On Windows the table is COM's standard one (CLSID_StdGlobalInterfaceTable), which marshals
// between apartments. Elsewhere there are no apartments: one in-process table keeps the
// IUnknown pointers under cookies and answers a fetch with QueryInterface.
#pragma once

#include "tekit/platform/WinTypes.h"

#include <cstdint>

struct IUnknown;

namespace tekit::platform {

/// An IGlobalInterfaceTable*.
using InterfaceTableHandle = void*;

/// CoCreateInstance of the standard table; an HRESULT.
long CreateInterfaceTable(InterfaceTableHandle& table);
void ReleaseInterfaceTable(InterfaceTableHandle table);
long RegisterInterfaceInTable(InterfaceTableHandle table, IUnknown* object, GUID const& iid,
                              std::uint32_t& cookie);
long RevokeInterfaceFromTable(InterfaceTableHandle table, std::uint32_t cookie);
long GetInterfaceFromTable(InterfaceTableHandle table, std::uint32_t cookie, GUID const& iid,
                           void** object);

/// IUnknown::AddRef and Release, for code that sees IUnknown only declared.
void AddRefInterface(IUnknown* object);
void ReleaseInterface(IUnknown* object);

/// CoInitializeEx(null, COINIT_MULTITHREADED) for the calling thread; an HRESULT.
long EnterMultithreadedApartment();
void LeaveApartment();

} // namespace tekit::platform

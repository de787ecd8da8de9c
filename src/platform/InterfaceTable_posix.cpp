// The global interface table where there is no COM: IUnknown pointers under cookies, in
// process, so the interface-table pointer and the releaser run the same code.
#include "platform/InterfaceTable.h"

#include <map>
#include <mutex>

namespace tekit::platform {

namespace {

constexpr long kInvalidArgument = static_cast<std::int32_t>(0x80070057); // E_INVALIDARG
constexpr long kOutOfMemory = static_cast<std::int32_t>(0x8007000E);     // E_OUTOFMEMORY

/// The one table of the process, as COM hands out one standard table.
struct Table {
    struct Entry {
        IUnknown* object;
        GUID iid;
    };
    std::mutex mutex;
    std::map<std::uint32_t, Entry> entries;
    std::uint32_t nextCookie = 1;
};

Table& TheTable() {
    static Table* const table = new Table; // outlives every static that may still revoke
    return *table;
}

/// The object registered under `cookie`, or null: removed from the table with its reference
/// when `remove`, else with a new reference added.
IUnknown* TakeEntry(InterfaceTableHandle raw, std::uint32_t cookie, bool remove) {
    auto& table = *static_cast<Table*>(raw);
    std::lock_guard<std::mutex> hold(table.mutex);
    auto const found = table.entries.find(cookie);
    if (found == table.entries.end())
        return nullptr;
    IUnknown* const object = found->second.object;
    if (remove)
        table.entries.erase(found);
    else
        object->AddRef();
    return object;
}

} // namespace

long CreateInterfaceTable(InterfaceTableHandle& table) {
    table = &TheTable();
    return 0;
}

void ReleaseInterfaceTable(InterfaceTableHandle) {}

long RegisterInterfaceInTable(InterfaceTableHandle raw, IUnknown* object, GUID const& iid,
                              std::uint32_t& cookie) {
    if (raw == nullptr || object == nullptr)
        return kInvalidArgument;
    auto& table = *static_cast<Table*>(raw);
    object->AddRef();
    try {
        std::lock_guard<std::mutex> hold(table.mutex);
        cookie = table.nextCookie++;
        if (cookie == 0) // 0 means "not registered" to callers
            cookie = table.nextCookie++;
        table.entries.emplace(cookie, Table::Entry{object, iid});
    } catch (...) {
        object->Release();
        return kOutOfMemory;
    }
    return 0;
}

long RevokeInterfaceFromTable(InterfaceTableHandle raw, std::uint32_t cookie) {
    IUnknown* const object = TakeEntry(raw, cookie, true);
    if (object == nullptr)
        return kInvalidArgument;
    object->Release(); // outside the table's lock: a release may run any amount of code
    return 0;
}

long GetInterfaceFromTable(InterfaceTableHandle raw, std::uint32_t cookie, GUID const& iid,
                           void** result) {
    *result = nullptr;
    // Held by a reference of our own while we query it, against a revocation meanwhile.
    IUnknown* const object = TakeEntry(raw, cookie, false);
    if (object == nullptr)
        return kInvalidArgument;
    long const hr = object->QueryInterface(iid, result);
    object->Release();
    return hr;
}

void AddRefInterface(IUnknown* object) {
    object->AddRef();
}

void ReleaseInterface(IUnknown* object) {
    object->Release();
}

long EnterMultithreadedApartment() {
    return 0;
}

void LeaveApartment() {}

} // namespace tekit::platform

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
    auto& table = *static_cast<Table*>(raw);
    IUnknown* object = nullptr;
    {
        std::lock_guard<std::mutex> hold(table.mutex);
        auto const found = table.entries.find(cookie);
        if (found == table.entries.end())
            return kInvalidArgument;
        object = found->second.object;
        table.entries.erase(found);
    }
    object->Release(); // outside the table's lock: a release may run any amount of code
    return 0;
}

long GetInterfaceFromTable(InterfaceTableHandle raw, std::uint32_t cookie, GUID const& iid,
                           void** result) {
    *result = nullptr;
    auto& table = *static_cast<Table*>(raw);
    IUnknown* object = nullptr;
    {
        std::lock_guard<std::mutex> hold(table.mutex);
        auto const found = table.entries.find(cookie);
        if (found == table.entries.end())
            return kInvalidArgument;
        object = found->second.object;
        object->AddRef(); // keeps it alive against a revocation while we query it
    }
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

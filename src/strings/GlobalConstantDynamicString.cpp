// Interned constants and their registry, sGlobalConstants.
//
// Constants may be created after start-up (function statics, constants of late-loaded code),
// so the registry is a std::set under a mutex. It is ordered by the text of each constant's
// own block, which never changes while the constant is registered: writing to a constant moves
// only its holder to a copy, so the registry stays sorted. Two constants of equal text: the
// first one registered is the one found.
#include "tekit/strings/GlobalConstantDynamicString.h"

#include <cstring>
#include <mutex>
#include <new>
#include <set>

namespace tekit {

namespace {

struct Entry {
    char const* text;
    GlobalConstantDynamicString* constant;
};

struct ByText {
    using is_transparent = void;
    bool operator()(Entry const& a, Entry const& b) const {
        return std::strcmp(a.text, b.text) < 0;
    }
    bool operator()(Entry const& a, char const* b) const { return std::strcmp(a.text, b) < 0; }
    bool operator()(char const* a, Entry const& b) const { return std::strcmp(a, b.text) < 0; }
};

struct Registry {
    std::mutex lock;
    std::set<Entry, ByText> constants;
};

/// Built on first use and never destroyed, so constants destroyed at exit can still leave it.
Registry& sGlobalConstants() {
    alignas(Registry) static unsigned char storage[sizeof(Registry)];
    static Registry* const registry = new (storage) Registry;
    return *registry;
}

} // namespace

GlobalConstantDynamicString::GlobalConstantDynamicString(char const* text)
    : DynamicString(ForDynamicStringNullMemoryReference{}),
      m_constant(reinterpret_cast<unsigned char const*>(text ? text : ""),
                 static_cast<int>(std::strlen(text ? text : "")) + 1, false) {
    m_memory = m_constant.AddRef();
    SetCachedSize(m_constant.GetBufferSize());
    Registry& registry = sGlobalConstants();
    std::lock_guard<std::mutex> guard(registry.lock);
    registry.constants.insert(Entry{reinterpret_cast<char const*>(m_constant.GetReadPtr()), this});
}

GlobalConstantDynamicString::~GlobalConstantDynamicString() {
    Unregister();
    if (m_memory == &m_constant)
        m_memory = nullptr; // the embedded block dies with this object, before the base
}

void GlobalConstantDynamicString::Unregister() {
    char const* text = reinterpret_cast<char const*>(m_constant.GetReadPtr());
    if (!text)
        return;
    Registry& registry = sGlobalConstants();
    std::lock_guard<std::mutex> guard(registry.lock);
    auto it = registry.constants.find(text);
    if (it != registry.constants.end() && it->constant == this)
        registry.constants.erase(it);
}

// The constant becomes an empty string; its text, which other strings may share, stays valid.
void GlobalConstantDynamicString::ClearMemory() {
    Unregister();
    DynamicString::Clear();
}

char* GlobalConstantDynamicString::GetBufferWritePtr() {
    // The embedded block counts 2, so the block's write path gives this string a heap copy.
    return DynamicString::GetBufferWritePtr();
}

String const* GlobalConstantDynamicString::GetGlobalConstantIfExists(String const* s) {
    if (!s)
        return s;
    Registry& registry = sGlobalConstants();
    std::lock_guard<std::mutex> guard(registry.lock);
    auto it = registry.constants.find(s->GetBufferReadPtr());
    if (it == registry.constants.end())
        return s;
    GlobalConstantDynamicString const* constant = it->constant;
    // A constant that was written to or cleared no longer holds the registered text.
    if (constant->m_memory != &constant->m_constant)
        return s;
    return constant;
}

void GlobalConstantDynamicString::ClearAllMemory() {
    Registry& registry = sGlobalConstants();
    std::lock_guard<std::mutex> guard(registry.lock);
    registry.constants.clear();
}

} // namespace tekit

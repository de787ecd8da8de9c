// The debug-output sink: one replaceable writer of diagnostic text, guarded across threads.
#include "tekit/errors/DebugOutput.h"

#include "platform/DebugOutput.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <set>
#include <string>
#include <thread>

namespace tekit {

namespace {

/// How long a writer waits for the debug-output lock before writing without it. Debug text
/// must never hang its caller: a holder stuck in a sink (or one that died holding the lock)
/// costs each later writer at most this long, and their text still comes out.
constexpr std::chrono::milliseconds kDebugLockWait{1000};

/// The debug-output lock: recursive, so a sink that itself writes debug text does not block,
/// and first come, first served, so under contention no writer waits out its bound while
/// others pass it. A waiter that gives up leaves its turn, which is then skipped.
class DebugLock {
public:
    bool TryLockFor(std::chrono::milliseconds bound) {
        auto const me = std::this_thread::get_id();
        std::unique_lock<std::mutex> guard(m_mutex);
        if (m_depth > 0 && m_owner == me) {
            ++m_depth;
            return true;
        }
        std::uint64_t const ticket = m_nextTicket++;
        if (!m_turn.wait_for(guard, bound, [&] { return m_serving == ticket && m_depth == 0; })) {
            m_abandoned.insert(ticket);
            return false;
        }
        m_owner = me;
        m_depth = 1;
        return true;
    }

    void Unlock() {
        std::lock_guard<std::mutex> guard(m_mutex);
        if (--m_depth > 0)
            return;
        m_owner = std::thread::id();
        ++m_serving;
        while (m_abandoned.erase(m_serving) > 0)
            ++m_serving;
        m_turn.notify_all();
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_turn;
    std::thread::id m_owner;
    int m_depth = 0;
    std::uint64_t m_nextTicket = 0;
    std::uint64_t m_serving = 0;
    std::set<std::uint64_t> m_abandoned;
};

/// Never freed, so writes from other statics' destructors at shutdown still find it.
DebugLock& TheDebugLock() {
    static auto* lock = new DebugLock;
    return *lock;
}

/// Holds the lock for a scope when it was taken; releases it even when a host's sink throws.
class DebugLockScope {
public:
    explicit DebugLockScope(std::chrono::milliseconds bound)
        : m_locked(TheDebugLock().TryLockFor(bound)) {}
    ~DebugLockScope() {
        if (m_locked)
            TheDebugLock().Unlock();
    }
    DebugLockScope(DebugLockScope const&) = delete;
    DebugLockScope& operator=(DebugLockScope const&) = delete;

private:
    bool m_locked;
};

/// How long SetDebugOutputSink waits: installing a sink must not race a write.
constexpr std::chrono::hours kSinkChangeWait{24};

void DefaultSink(char const* text, void*) {
    platform::WriteDebugText(text);
}

// Atomic so a writer that could not take the lock still reads a whole pointer.
std::atomic<DebugOutputSink> gSink{&DefaultSink};
std::atomic<void*> gSinkContext{nullptr};

} // namespace

void SetDebugOutputSink(DebugOutputSink sink, void* context) {
    DebugLockScope const lock(kSinkChangeWait);
    gSinkContext.store(sink ? context : nullptr);
    gSink.store(sink ? sink : &DefaultSink);
}

void WriteToCDebug(char const* text) {
    if (!text)
        return;
    DebugLockScope const lock(kDebugLockWait);
    gSink.load()(text, gSinkContext.load());
}

void FlushStringStreamToCDebug(std::ostringstream& stream) {
    std::string const text = stream.str();
    stream.str(std::string());
    stream.clear();
    WriteToCDebug(text.c_str());
}

} // namespace tekit

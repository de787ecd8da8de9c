// Test helpers: capture the debug output, and set the diagnostic level for one test.
#pragma once

#include "tekit/errors/DebugOutput.h"
#include "tekit/errors/DiagnosticLevel.h"

#include <atomic>
#include <mutex>
#include <string>
#include <thread>

namespace tekit::testing {

/// Collects every text written to the debug output while it lives. It also records whether
/// two writes ever reached the sink at the same time, which serialised output never does.
class DebugCapture {
public:
    DebugCapture() { SetDebugOutputSink(&Sink, this); }
    ~DebugCapture() { SetDebugOutputSink(nullptr, nullptr); }
    DebugCapture(DebugCapture const&) = delete;
    DebugCapture& operator=(DebugCapture const&) = delete;

    std::string Text() const {
        std::lock_guard<std::mutex> lock(m_mutex);
        return m_text;
    }
    bool SawOverlap() const { return m_overlap.load(); }

private:
    static void Sink(char const* text, void* context) {
        auto* self = static_cast<DebugCapture*>(context);
        if (self->m_inside.exchange(true))
            self->m_overlap = true;
        std::this_thread::yield(); // widen the window in which an unserialised write overlaps
        {
            std::lock_guard<std::mutex> lock(self->m_mutex);
            self->m_text += text;
        }
        self->m_inside = false;
    }

    mutable std::mutex m_mutex;
    std::string m_text;
    std::atomic<bool> m_inside{false};
    std::atomic<bool> m_overlap{false};
};

/// Sets the diagnostic level for one scope and restores the previous one.
class DiagnosticLevelScope {
public:
    explicit DiagnosticLevelScope(int level) : m_previous(OrvaneMiscUtil::GetDiagnosticLevel()) {
        OrvaneMiscUtil::SetDiagnosticLevel(level);
    }
    ~DiagnosticLevelScope() { OrvaneMiscUtil::SetDiagnosticLevel(m_previous); }
    DiagnosticLevelScope(DiagnosticLevelScope const&) = delete;
    DiagnosticLevelScope& operator=(DiagnosticLevelScope const&) = delete;

private:
    int m_previous;
};

} // namespace tekit::testing

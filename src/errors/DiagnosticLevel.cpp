// The process-wide diagnostic level, read once from TEKIT_DIAGNOSTIC_LEVEL and settable.
#include "tekit/errors/DiagnosticLevel.h"

#include "platform/Environment.h"

#include <atomic>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <mutex>
#include <string>

namespace tekit::OrvaneMiscUtil {

namespace {

/// The variable's value as a level: a decimal number with optional sign and surrounding
/// blanks; anything else (or a number outside int) is 0.
int ParseLevel(std::string const& text) {
    char const* begin = text.c_str();
    char* end = nullptr;
    errno = 0;
    long const value = std::strtol(begin, &end, 10);
    if (end == begin || errno == ERANGE || value < INT_MIN || value > INT_MAX)
        return 0;
    while (*end == ' ' || *end == '\t')
        ++end;
    return *end == '\0' ? int(value) : 0;
}

std::atomic<int> gLevel{0};
std::once_flag gLevelRead;

void ReadLevelOnce() {
    std::call_once(gLevelRead, [] {
        std::string value;
        if (platform::GetEnvironmentVariable("TEKIT_DIAGNOSTIC_LEVEL", value))
            gLevel.store(ParseLevel(value));
    });
}

} // namespace

int GetDiagnosticLevel() {
    ReadLevelOnce();
    return gLevel.load();
}

void SetDiagnosticLevel(int level) {
    ReadLevelOnce();
    gLevel.store(level);
}

} // namespace tekit::OrvaneMiscUtil

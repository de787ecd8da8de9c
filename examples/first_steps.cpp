// A first program over tekit: build text with the string family, report a failure the way
// every module of the product does, and show the codes a caller outside C++ would see.
//
//   first_steps "Bench 3"
#include "tekit/tekit.h"

#include <cstdio>

using namespace tekit;

/// Stands for any operation that fails: it raises as a missing settings file would.
static void LoadStationSettings(String const& station) {
    DynamicString description("No settings file for station ");
    description += station;
    description += ".";
    TE_RAISE(TE_FILE_NOT_FOUND, description, "Station::LoadSettings");
}

int main(int argc, char** argv) {
    DynamicString const station(argc > 1 ? argv[1] : "Bench 3");
    try {
        LoadStationSettings(station);
    } catch (TEException const& e) {
        TEError const code = e.GetErrorCode();
        std::printf("%s failed: %s\n", e.GetFunctionName(), e.GetDescription());
        std::printf("  code %d (%s), COM code 0x%08X\n", static_cast<int>(code),
                    TEErrorToStringSymbol(code), static_cast<unsigned>(GetWinErrorCode(code)));
        std::printf("  message: %s\n", static_cast<char const*>(TEErrorToRString(code)));
        return 1;
    }
    return 0;
}

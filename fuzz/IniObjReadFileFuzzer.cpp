// Fuzzes IniObj::ReadFile over arbitrary file bytes: INI text, the compressed binary form
// ("OrvaneBinary" and its 32-byte header) and the text binary form ("OrvaneBinaryText" and a
// compressed string) are all reached, the seed corpus holding one file of each. A file that is
// refused must raise a TEException and leave the object as it was; one that is read must
// write out in the text binary form and read back equal, unless its text has a line longer
// than the reader's 640 bytes (only a tag of several hundred bytes makes one), which reading
// would cut.
#include "tekit/errors/TEException.h"
#include "tekit/ini/IniObj.h"
#include "tekit/paths/Path.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <string>
#include <unistd.h>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// The file the inputs are written to: one per process, in memory where the system has it.
std::string const& InputPath() {
    static std::string const path = [] {
        std::filesystem::path const folder = std::filesystem::exists("/dev/shm")
                                                 ? std::filesystem::path("/dev/shm")
                                                 : std::filesystem::temp_directory_path();
        return (folder / ("iniobj-fuzz-" + std::to_string(getpid()) + ".ini")).string();
    }();
    return path;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::FILE* file = std::fopen(InputPath().c_str(), "wb");
    Check(file != nullptr);
    Check(std::fwrite(data, 1, size, file) == size);
    std::fclose(file);

    tekit::IniObj ini(false, tekit::DynamicString("[Before]\nx = 1\n"));
    tekit::IniObj before(false, tekit::DynamicString("[Before]\nx = 1\n"));
    try {
        ini.ReadFile(tekit::Path(InputPath().c_str()));
    } catch (tekit::TEException const&) {
        Check(ini.Compare(before));
        return 0;
    }
    tekit::DynamicString text, packed;
    ini.WriteString(text);
    std::string const lines = text.GetBufferReadPtr();
    for (std::size_t start = 0, end; start < lines.size(); start = end + 1) {
        end = lines.find('\n', start);
        if (end - start > 640)
            return 0;
    }
    ini.WriteString(packed, true, false);
    tekit::IniObj back(false, packed);
    Check(back.Compare(ini));
    return 0;
}

// A directory of its own under the system's temporary directory for one test: created empty,
// removed with everything in it (read-only entries included) when the object goes.
//
//   ScratchDirectory scratch("ini");
//   std::string const file = (scratch.Root() / "station.ini").string();
#pragma once

#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>
#include <system_error>

namespace tekit::testing {

class ScratchDirectory {
public:
    explicit ScratchDirectory(char const* purpose) {
        std::random_device random;
        m_root = std::filesystem::temp_directory_path() /
                 ("tekit-" + std::string(purpose) + "-" + std::to_string(random()));
        std::filesystem::create_directories(m_root);
    }
    ~ScratchDirectory() {
        namespace fs = std::filesystem;
        std::error_code ignored; // a failed clean-up must not hide the test's own result
        for (auto const& entry : fs::recursive_directory_iterator(m_root, ignored))
            fs::permissions(entry.path(), fs::perms::owner_all, fs::perm_options::add, ignored);
        fs::remove_all(m_root, ignored);
    }
    ScratchDirectory(ScratchDirectory const&) = delete;
    ScratchDirectory& operator=(ScratchDirectory const&) = delete;

    std::filesystem::path const& Root() const { return m_root; }

private:
    std::filesystem::path m_root;
};

/// The bytes of the file at `path`; empty when it cannot be read.
inline std::string ReadFileBytes(std::filesystem::path const& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/// Makes `bytes` the whole contents of the file at `path`.
inline void WriteFileBytes(std::filesystem::path const& path, std::string const& bytes) {
    std::ofstream(path, std::ios::binary) << bytes;
}

} // namespace tekit::testing

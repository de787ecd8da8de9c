// A directory of its own under the system's temporary directory for one test: created empty,
// removed with everything in it (read-only entries included) when the object goes.
//
//   ScratchDirectory scratch("ini");
//   std::string const file = (scratch.Root() / "station.ini").string();
#pragma once

#include <filesystem>
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

} // namespace tekit::testing

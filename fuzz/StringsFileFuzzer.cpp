// Fuzzes the strings-file reader: arbitrary bytes are read as a strings file (UTF-8 INI text,
// lines the INI reader would ignore refused). A refused file must raise a TEException and
// leave the rows held as they were; an accepted one enters the message table, where each row
// must then be found with its text.
//
// Input: byte 0 holds options (bit 0 Shift-JIS multibyte mode, so lines are converted to code
// page 932 before the INI reader sees them), the rest is the file's bytes.
#include "tekit/errors/RString.h"
#include "tekit/errors/TEException.h"
#include "tekit/ini/StringsFile.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/String.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <set>
#include <string>
#include <utility>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size < 1)
        return 0;
    unsigned const options = data[0];
    tekit::SetMultiByteCodePage(options & 1 ? 932 : 0);
    tekit::String::EnableMultiByteSupport((options & 1) != 0);

    static char const kKeep[] = "[KEEP]\nA = kept\n";
    tekit::StringsFile file;
    file.ReadText("keep", kKeep, sizeof kKeep - 1);
    bool accepted = true;
    try {
        file.ReadText("fuzz", data + 1, size - 1);
    } catch (tekit::TEException const& e) {
        accepted = false;
        Check(e.GetErrorCode() == tekit::TE_BAD_FILE_FORMAT);
        Check(std::strncmp(e.GetDescription(), "fuzz:", 5) == 0); // names the file and line
        Check(file.GetNumRows() == 1 && std::strcmp(file.GetText(0), "kept") == 0);
    }
    if (accepted) {
        std::set<std::pair<std::string, std::string>> names;
        for (int i = 0; i < file.GetNumRows(); ++i) {
            Check(*file.GetKey(i) != '\0' && *file.GetSection(i) != '\0');
            Check(file.GetLine(i) >= 1);
            Check(names.insert({file.GetSection(i), file.GetKey(i)}).second); // no key twice
        }
        tekit::RString::ResetStrings();
        file.Use();
        for (int i = 0; i < file.GetNumRows(); ++i) {
            bool found = false;
            tekit::RString const text(file.GetSection(i), file.GetKey(i), nullptr, &found);
            Check(found && std::strcmp(text, file.GetText(i)) == 0);
        }
        tekit::RString::ResetStrings(); // the next input's messages come from the built-in rows
    }
    tekit::String::EnableMultiByteSupport(false);
    tekit::SetMultiByteCodePage(0);
    return 0;
}

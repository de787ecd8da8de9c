// Fuzzes the path rules: validation, dot collapsing, splitting and abbreviation, on fixed and
// heap paths, in single-byte and Shift-JIS multibyte mode.
//
// Input: one byte of options (bit 0 multibyte mode, bit 1 wildcards allowed, bits 2-7 the
// width to abbreviate to), then the path text (up to its first NUL).
#include "tekit/errors/TEException.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/MultiByte.h"

#include <cstddef>
#include <cstdint>
#include <string>

using namespace tekit;

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// A found range lies inside the text; a file name runs to the end.
void CheckSplitting(String const& text) {
    int const n = text.GetNumChars();
    int start = -1, length = -1;
    if (PathBase::FindFileName(text, start, length))
        Check(start >= 0 && length >= 0 && start + length == n);
    int const nameStart = start;
    if (PathBase::FindExtension(text, start, length))
        Check(start >= nameStart && length >= 1 && start + length == n &&
              length <= PathBase::kMaxFileExtensionLength + 1);
    if (PathBase::FindBaseName(text, start, length))
        Check(start == nameStart && length >= 1 && start + length <= n);
}

/// Operations on levels raise for a UNC text without a share; every other result is checked.
void CheckLevels(PathBase const& path) {
    try {
        long const levels = path.GetNumLevels();
        Check(levels >= 0 && levels <= path.GetString().GetNumChars());
        Path prefix;
        Check(path.GetPrefix(levels, prefix));
        Check(!path.GetPrefix(levels + 1, prefix));
        Check(PathBase::FindCommonPrefix(path, path).GetNumLevels() <= levels);
        DynamicString components;
        path.GetUpToCntPathNameComponents(path.GetNumPathNameComponents(), components);
        path.GetRootDir();
    } catch (TEException const& e) {
        Check(e.GetErrorCode() == TE_PROGRAM_ERROR);
    }
}

void Exercise(PathBase& path, bool wildcards, int maxChars) {
    DynamicString message, out;
    bool const valid = path.IsValid(wildcards, &message);
    Check(valid == message.IsEmpty());
    CheckSplitting(path.GetString());
    CheckLevels(path);
    path.GetDirectoryPathName(out);
    path.GetBaseName(out);
    path.GetExtension(out);
    path.GetCRXStylePathString();
    PathBase::ConvertForLongPathCalls(path.GetString(), out);
    Check(out.GetNumChars() >= path.GetString().GetNumChars());
    try {
        path.GetAbbreviatedName(maxChars, out);
        Check(out.GetNumChars() <= path.GetString().GetNumChars());
    } catch (TEException const& e) {
        Check(e.GetErrorCode() == TE_PROGRAM_ERROR);
    }
    DynamicPath collapsed(path);
    collapsed.CollapseDots();
    if (!valid)
        Check(collapsed == path); // only valid paths are rewritten
    collapsed.CoalesceDoubleSeparators();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size == 0)
        return 0;
    bool const multiByte = (data[0] & 1) != 0;
    bool const wildcards = (data[0] & 2) != 0;
    int const maxChars = data[0] >> 2;
    std::string const text(reinterpret_cast<char const*>(data) + 1, size - 1);
    SetMultiByteCodePage(multiByte ? 932 : 0);
    String::EnableMultiByteSupport(multiByte);

    Path fixed(text.c_str());
    DynamicPath dynamic(text.c_str());
    Exercise(fixed, wildcards, maxChars);
    Exercise(dynamic, wildcards, maxChars);
    return 0;
}

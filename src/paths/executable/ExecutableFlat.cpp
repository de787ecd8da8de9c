// The flat interface of executable files: statuses instead of exceptions.
#include "tekit/errors/TEException.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/ExecutableFile.h"

#include <new>

namespace {

/// `ask`'s answer, or the TEError of what it raised.
template <typename Ask> int Answer(char const* path, Ask ask) {
    try {
        return ask(tekit::ExecutableFile(tekit::DynamicPath(path ? path : "")));
    } catch (tekit::TEException const& e) {
        return e.GetErrorCode();
    } catch (std::bad_alloc const&) {
        return tekit::TE_OUT_OF_MEMORY;
    } catch (...) {
        return tekit::TE_PROGRAM_ERROR;
    }
}

} // namespace

extern "C" int TEKIT_STDCALL GetExecutableBitness(char const* path) {
    return Answer(path, [](tekit::ExecutableFile const& file) { return file.GetBitness(); });
}

extern "C" int TEKIT_STDCALL IsExecutableLargeAddressAware(char const* path) {
    return Answer(
        path, [](tekit::ExecutableFile const& file) { return file.IsLargeAddressAware() ? 1 : 0; });
}

extern "C" int TEKIT_STDCALL GetExecutableMachine(char const* path) {
    return Answer(path, [](tekit::ExecutableFile const& file) { return int{file.GetMachine()}; });
}

extern "C" int TEKIT_STDCALL ExecutableExportsFunction(char const* path, char const* name) {
    return Answer(path, [name](tekit::ExecutableFile const& file) {
        return file.ReadExports().Find(name) ? 1 : 0;
    });
}

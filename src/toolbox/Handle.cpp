// Handles: relocatable heap blocks behind a record that stays put, and their null-handle assertion.
#include "tekit/toolbox/Handle.h"

#include "platform/AssertBox.h"
#include "toolbox/HandleAssert.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace tekit::toolbox {

std::string AssertText(char const* message, int line, char const* file) {
    char const* const format = "Assert!\n\n%s\n\nThe error was detected on line %d of file "
                               "'%s'.\n\nProgram aborting.";
    int const length = std::snprintf(nullptr, 0, format, message, line, file);
    std::string text(length > 0 ? static_cast<std::size_t>(length) : 0, '\0');
    std::snprintf(text.data(), text.size() + 1, format, message, line, file);
    return text;
}

void AssertFailed(char const* message, int line, char const* file) {
    char const* const slash = std::strrchr(file, '/');
    char const* const backslash = std::strrchr(file, '\\');
    char const* const base = slash > backslash ? slash + 1 : backslash ? backslash + 1 : file;
    try {
        platform::ShowAssertBox("Assert", AssertText(message, line, base).c_str());
    } catch (...) {
        platform::ShowAssertBox("Assert", message); // no memory for the full text
    }
    std::abort();
}

} // namespace tekit::toolbox

#define TEKIT_ASSERT_HANDLE(handle, function)                                                      \
    do {                                                                                           \
        if (!(handle))                                                                             \
            tekit::toolbox::AssertFailed("Parameter 1 to " function " was NULL.", __LINE__,        \
                                         __FILE__);                                                \
    } while (false)

extern "C" Handle TEKIT_STDCALL NewHandle(std::uint32_t size) {
    auto* handle = static_cast<Handle>(std::malloc(sizeof(HandleRecord)));
    if (!handle)
        return nullptr;
    handle->block = size ? std::calloc(size, 1) : nullptr;
    handle->size = size;
    if (size && !handle->block) {
        std::free(handle);
        return nullptr;
    }
    return handle;
}

extern "C" std::uint32_t TEKIT_STDCALL GetHandleSize(Handle handle) {
    TEKIT_ASSERT_HANDLE(handle, "GetHandleSize");
    return handle->size;
}

extern "C" std::int32_t TEKIT_STDCALL SetHandleSize(Handle handle, std::uint32_t newSize) {
    TEKIT_ASSERT_HANDLE(handle, "SetHandleSize");
    if (newSize == handle->size)
        return 1;
    if (newSize == 0) {
        std::free(handle->block);
        handle->block = nullptr;
        handle->size = 0;
        return 1;
    }
    void* const block = std::realloc(handle->block, newSize);
    if (!block)
        return 0; // realloc keeps the old block
    if (newSize > handle->size)
        std::memset(static_cast<char*>(block) + handle->size, 0, newSize - handle->size);
    handle->block = block;
    handle->size = newSize;
    return 1;
}

extern "C" void TEKIT_STDCALL DisposeHandle(Handle handle) {
    if (!handle)
        return;
    std::free(handle->block);
    std::free(handle);
}

// The boundary of the flat interface: no C++ exception may reach a C caller.
#pragma once

#include <utility>

namespace tekit::toolbox {

/// Runs `body` and returns its result, or `failure` when it throws (an allocation inside the
/// library, or a caller's callback).
template <class Result, class Body> Result Guarded(Result failure, Body&& body) noexcept {
    try {
        return std::forward<Body>(body)();
    } catch (...) {
        return failure;
    }
}

/// The same for functions without a result.
template <class Body> void Guarded(Body&& body) noexcept {
    try {
        std::forward<Body>(body)();
    } catch (...) {
    }
}

} // namespace tekit::toolbox

// The boundary of the flat interface: no C++ exception may reach a C caller.
//
//   extern "C" int TEKIT_STDCALL Foo(...) {
//       return toolbox::Guarded(TE_OUT_OF_MEMORY, [&] { return DoFoo(...); });
//   }
#pragma once

#include <new>
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

/// Runs `body` and returns its result; `onBadAlloc` for exhaustion and `onOther` for any other
/// exception (a caller's callback).
template <class Result, class Body>
Result Guarded(Result onBadAlloc, Result onOther, Body&& body) noexcept {
    try {
        return std::forward<Body>(body)();
    } catch (std::bad_alloc const&) {
        return onBadAlloc;
    } catch (...) {
        return onOther;
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

// Expectations on the TEException that a statement raises.
//
//   EXPECT_RAISES(s.CvtToInt32(), TE_UNRECOGNIZED_VALUE);
//   EXPECT_RAISES_IN(view = "x", TE_PROGRAM_ERROR, "BufferString::GetBufferWritePtr");
//   EXPECT_RAISES_IN(path.Validate(false), TE_INVALID_PATHNAME, "PathBase::Validate",
//                    "Path is empty.");
//   TEException const e = Raised([&] { file.Delete(); });   // to look at the other fields
//
// Each fails the test, at the line that uses it, when the statement raises nothing, throws
// something other than a TEException, or raises another code, function or description. The
// message names what was expected and what happened instead.
#pragma once

#include "tekit/errors/TEError.h"
#include "tekit/errors/TEException.h"

#include <gtest/gtest.h>

#include <cstring>
#include <exception>
#include <source_location>
#include <string>

namespace tekit::testing {
namespace detail {

/// What running a statement threw.
struct RaiseOutcome {
    enum Kind { kNothing, kTEException, kStdException, kOther } kind = kNothing;
    TEException raised;
    std::string what;
};

template <class F> RaiseOutcome RunRaising(F&& statement) {
    RaiseOutcome outcome;
    try {
        statement();
    } catch (TEException const& e) {
        outcome.kind = RaiseOutcome::kTEException;
        outcome.raised = e;
    } catch (std::exception const& e) {
        outcome.kind = RaiseOutcome::kStdException;
        outcome.what = e.what();
    } catch (...) {
        outcome.kind = RaiseOutcome::kOther;
    }
    return outcome;
}

/// "TE_DISK_FULL (-17208)", or the bare number for a code outside the table.
inline std::string DescribeCode(TEError code) {
    std::string const symbol = TEErrorToStringSymbol(code);
    std::string const value = std::to_string(static_cast<long>(code));
    return symbol.empty() ? value : symbol + " (" + value + ")";
}

inline std::string DescribeOutcome(RaiseOutcome const& outcome) {
    switch (outcome.kind) {
    case RaiseOutcome::kNothing:
        return "it raises nothing";
    case RaiseOutcome::kStdException:
        return "it throws a std::exception: " + outcome.what;
    case RaiseOutcome::kOther:
        return "it throws something that is neither a TEException nor a std::exception";
    case RaiseOutcome::kTEException:
        break;
    }
    TEException const& e = outcome.raised;
    return "it raises " + DescribeCode(e.GetErrorCode()) + " in \"" + e.GetFunctionName() +
           "\" with the description \"" + e.GetDescription() + "\"";
}

/// Whether `outcome` is a TEException of `code` and, where given, of `function` and
/// `description` (exact texts).
inline ::testing::AssertionResult CheckRaised(char const* statement, RaiseOutcome const& outcome,
                                              TEError code, char const* function,
                                              char const* description = nullptr) {
    TEException const& e = outcome.raised;
    if (outcome.kind == RaiseOutcome::kTEException && e.GetErrorCode() == code &&
        (function == nullptr || std::strcmp(e.GetFunctionName(), function) == 0) &&
        (description == nullptr || std::strcmp(e.GetDescription(), description) == 0))
        return ::testing::AssertionSuccess();
    ::testing::AssertionResult failure = ::testing::AssertionFailure();
    failure << "Expected: " << statement << "\n  raises " << DescribeCode(code);
    if (function != nullptr)
        failure << " in \"" << function << "\"";
    if (description != nullptr)
        failure << " with the description \"" << description << "\"";
    return failure << "\n  Actual: " << DescribeOutcome(outcome);
}

} // namespace detail

/// The TEException that `statement` (a callable) raises. Anything else fails the test at the
/// caller's line, and an empty TEException is returned.
template <class F>
TEException Raised(F&& statement, std::source_location where = std::source_location::current()) {
    detail::RaiseOutcome outcome = detail::RunRaising(statement);
    if (outcome.kind != detail::RaiseOutcome::kTEException)
        ADD_FAILURE_AT(where.file_name(), static_cast<int>(where.line()))
            << "Expected a TEException, but " << detail::DescribeOutcome(outcome);
    return outcome.raised;
}

} // namespace tekit::testing

/// Expects `statement` to raise a TEException with the error `code`.
#define EXPECT_RAISES(statement, code) EXPECT_RAISES_IN(statement, code, nullptr)

/// EXPECT_RAISES_IN(statement, code, function[, description]): also the qualified function
/// name and, when given, the exact description.
#define EXPECT_RAISES_IN(statement, code, ...)                                                     \
    switch (0)                                                                                     \
    case 0:                                                                                        \
    default:                                                                                       \
        if (::testing::AssertionResult const tekitRaisesResult =                                   \
                ::tekit::testing::detail::CheckRaised(                                             \
                    #statement, ::tekit::testing::detail::RunRaising([&] { statement; }), code,    \
                    __VA_ARGS__))                                                                  \
            ;                                                                                      \
        else                                                                                       \
            ADD_FAILURE() << tekitRaisesResult.message() << "\n"

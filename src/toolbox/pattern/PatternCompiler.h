// The pattern compiler: tokenizes and parses a pattern, reports its structural errors, and
// builds the automata and skip tables of a CompiledPattern.
//
//   CompiledPattern compiled;
//   PatternError error = Compile("ERROR {[0-9]+}", /*caseSensitive=*/true, false, compiled);
#pragma once

#include "toolbox/pattern/PatternProgram.h"
#include "toolbox/pattern/PatternTokenizer.h"

namespace tekit::toolbox::pattern {

/// Errors come in the order the pattern is read: lexical errors first (the whole pattern is
/// tokenized), then structural errors and set errors from left to right. Nesting depth is
/// bounded only by memory: the parser keeps its open groups on the heap.
PatternError Compile(char const* pattern, bool caseSensitive, bool multiByte,
                     CompiledPattern& compiled);

} // namespace tekit::toolbox::pattern

// The entry point of the generated scanner and parser of dynamic-field texts.
#pragma once
#include <cstddef>
#include <string>

// Results of ParseOverrideText.
constexpr int kParseAccepted = 0;
constexpr int kParseSyntaxError = 1;     // "syntax error" printed on standard output
constexpr int kParseStackOverflow = 2;   // "parser stack overflow" printed on standard output
constexpr int kParseScannerFailure = 3;  // the scanner's fatal message printed on standard error
constexpr int kParseTooLong = 4;         // the text is longer than kMaxScriptLength
constexpr int kParseTooDeep = 5;         // a tree grew deeper than kMaxExpressionDepth

// The bounds on a script, past which it is refused as one that does not parse, so that a
// hostile content file costs bounded time, memory and stack. Scripts in real content files are
// a few hundred bytes and a few levels deep.
// - Length: the text's bytes up to its first NUL. Parsing is linear in the text, so this bounds
//   the time and memory of one row's parse.
constexpr std::size_t kMaxScriptLength = 64 * 1024;
// - Depth: the levels of the tree on the right of one assignment (a literal or a variable is 1,
//   a call one more than its deepest parameter; the assignment's SET adds one). Copying,
//   validating, evaluating and destroying a tree recurse once per level; at this bound that
//   stays far inside a 1 MiB thread stack (the default of a Windows program's main thread).
//   The parser's own stack (200 states) already bounds nesting by parentheses, NOT and calls;
//   left-associative chains such as "a AND b AND c ..." are what grow past it.
constexpr int kMaxExpressionDepth = 256;

// Scans and parses text once, from the scanner's initial condition, pushing each assignment into
// the current plan as the grammar reduces it. The scanner works on its own copy of the text and
// is reset afterwards, whatever the outcome; a scanner fatal condition or a bound exceeded ends
// only this parse. Not reentrant: the scanner and parser state is process-wide.
int ParseOverrideText(const std::string& text);

// The message printed on standard output for kParseTooLong and kParseTooDeep; empty for the
// other results.
std::string ParseRefusalMessage(int result);

// Called by the grammar when it builds a node deeper than kMaxExpressionDepth: prints the
// message and ends the parse with kParseTooDeep.
[[noreturn]] void RefuseTooDeep();

// The entry point of the generated scanner and parser of dynamic-field texts.
#pragma once
#include <string>

// Results of ParseOverrideText.
constexpr int kParseAccepted = 0;
constexpr int kParseSyntaxError = 1;     // "syntax error" printed on standard output
constexpr int kParseStackOverflow = 2;   // "parser stack overflow" printed on standard output
constexpr int kParseScannerFailure = 3;  // the scanner's fatal message printed on standard error

// Scans and parses text once, from the scanner's initial condition, pushing each assignment into
// the current plan as the grammar reduces it. The scanner works on its own copy of the text and
// is reset afterwards, whatever the outcome; a scanner fatal condition ends only this parse.
// Not reentrant: the scanner and parser state is process-wide.
int ParseOverrideText(const std::string& text);

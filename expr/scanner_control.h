// The links between the generated scanner and the parse entry point (internal to expr/).
#pragma once
#include <cstddef>

// Makes buffer (size bytes, the last two of them NUL) the scanner's input; the buffer must
// outlive the scan.
void ScannerInstall(char* buffer, std::size_t size);
// Releases the input and returns the scanner to its initial state and start condition.
void ScannerReset();

// Thrown by ScannerFatal to unwind out of the scanner and the parser.
struct ScannerFailure {};
// Reports a fatal scanner condition on standard error and throws ScannerFailure.
[[noreturn]] void ScannerFatal(const char* message);

// Marks where the parser met a syntax error, for LastSyntaxError: the text of the token it could
// not take, or the end of the text when it ran out of input.
void ScannerNoteSyntaxError(bool atEnd);

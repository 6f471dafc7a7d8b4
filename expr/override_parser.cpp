#include "expr/override_parser.h"

#include <cstdio>
#include <cstring>
#include <vector>

#include "expr/override_grammar.hpp"
#include "expr/scanner_control.h"

void ScannerFatal(const char* message) {
    std::fprintf(stderr, "%s\n", message);
    throw ScannerFailure();
}

namespace {

// Resets the scanner on every way out of a parse, exceptions included.
class ScannerSession {
public:
    // The text is taken as a C string, as the row hands it over: it ends at its first NUL.
    explicit ScannerSession(const std::string& text)
        : buffer_(text.c_str(), text.c_str() + std::strlen(text.c_str())) {
        // The scanner's own copy ends in the two NUL bytes that mark the end of its buffer.
        buffer_.push_back('\0');
        buffer_.push_back('\0');
        ScannerReset();
        ScannerInstall(buffer_.data(), buffer_.size());
    }
    ~ScannerSession() { ScannerReset(); }
    ScannerSession(const ScannerSession&) = delete;
    ScannerSession& operator=(const ScannerSession&) = delete;

private:
    std::vector<char> buffer_;
};

}  // namespace

int ParseOverrideText(const std::string& text) {
    try {
        ScannerSession session(text);
        return pexexprparse();
    } catch (const ScannerFailure&) {
        ScannerReset();  // also when the failure came while the input was being installed
        return kParseScannerFailure;
    }
}

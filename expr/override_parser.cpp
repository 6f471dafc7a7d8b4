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

// Thrown by RefuseTooDeep to unwind out of the parser; the value stack's trees go with it.
struct TreeTooDeep {};

// Resets the scanner on every way out of a parse, exceptions included.
class ScannerSession {
public:
    explicit ScannerSession(const char* text, std::size_t length) : buffer_(text, text + length) {
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

int Refuse(int result) {
    std::printf("%s\n", ParseRefusalMessage(result).c_str());
    return result;
}

}  // namespace

std::string ParseRefusalMessage(int result) {
    if (result == kParseTooLong) {
        return "script too long, exceeds " + std::to_string(kMaxScriptLength) + " bytes";
    }
    if (result == kParseTooDeep) {
        return "expression too deep, exceeds " + std::to_string(kMaxExpressionDepth) + " levels";
    }
    return std::string();
}

void RefuseTooDeep() { throw TreeTooDeep(); }

int ParseOverrideText(const std::string& text) {
    // The text is taken as a C string, as the row hands it over: it ends at its first NUL.
    const std::size_t length = std::strlen(text.c_str());
    if (length > kMaxScriptLength) return Refuse(kParseTooLong);
    try {
        ScannerSession session(text.c_str(), length);
        return pexexprparse();
    } catch (const ScannerFailure&) {
        ScannerReset();  // also when the failure came while the input was being installed
        return kParseScannerFailure;
    } catch (const TreeTooDeep&) {
        return Refuse(kParseTooDeep);
    }
}

#include "tests/support/trace_capture.h"

#include <algorithm>
#include <regex>

#include "platform/files.h"

namespace pextest {

TraceCapture::TraceCapture(const std::string& winPath, TraceLog& log) : path_(winPath), log_(log) {
    log_.Close();
    log_.enabled = log_.timestamps = log_.ensureNewline = true;
    log_.keepOpen = false;
    log_.SetSubstitution("", "");
    log_.SetFileName(path_);
    log_.Delete();
    log_.fileOutput = true;
}

TraceCapture::~TraceCapture() {
    log_.Close();
    log_.SetFileName("");
    log_.fileOutput = false;
}

std::string TraceCapture::Bytes() const {
    std::string bytes;
    plat::files::ReadAll(path_, &bytes);
    return bytes;
}

std::vector<std::string> TraceCapture::Lines() const {
    return TraceLines(Bytes());
}

std::string TraceCapture::Text() const {
    std::string text;
    for (const std::string& line : Lines()) text += line + "\n";
    return text;
}

bool TraceCapture::Contains(const std::string& line) const {
    std::vector<std::string> lines = Lines();
    return std::find(lines.begin(), lines.end(), line) != lines.end();
}

void TraceCapture::Clear() {
    log_.Delete();
}

std::vector<std::string> TraceLines(const std::string& bytes) {
    // A leading "yyyy/mm/dd - hh:mm:ss.mmm - " stamp goes; a line without one stays as it is.
    static const std::regex stamp(R"(^\d{4}/\d{2}/\d{2} - \d{2}:\d{2}:\d{2}\.\d{3} - )");
    std::vector<std::string> lines;
    std::size_t start = 0;
    for (std::size_t lf; (lf = bytes.find('\n', start)) != std::string::npos; start = lf + 1) {
        std::size_t end = lf > start && bytes[lf - 1] == '\r' ? lf - 1 : lf;
        lines.push_back(std::regex_replace(bytes.substr(start, end - start), stamp, "",
                                           std::regex_constants::format_first_only));
    }
    return lines;
}

}  // namespace pextest

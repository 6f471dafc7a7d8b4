// The Windows rule for splitting a command line into arguments (CommandLineToArgvW). Portable:
// the posix backend needs it to hand a Windows command line to exec, and tests check it alone.
#include "platform/process.h"

namespace plat::proc {

namespace {

bool IsBlank(char c) { return c == ' ' || c == '\t'; }

// The program name: up to the closing quote when it starts with one, else up to the first
// blank. Backslashes are not special here, so "C:\dir\" stays a folder path.
std::size_t ReadProgram(const std::string& line, std::size_t i, std::string* out) {
    if (i < line.size() && line[i] == '"') {
        std::size_t end = line.find('"', i + 1);
        if (end == std::string::npos) end = line.size();
        *out = line.substr(i + 1, end - i - 1);
        return end < line.size() ? end + 1 : end;
    }
    std::size_t end = i;
    while (end < line.size() && !IsBlank(line[end])) ++end;
    *out = line.substr(i, end - i);
    return end;
}

// Backslashes count only when a quote follows them: 2n give n and the quote acts, 2n+1 give n
// and a literal quote.
std::size_t ReadBackslashes(const std::string& line, std::size_t i, std::string* arg) {
    std::size_t n = 0;
    while (i + n < line.size() && line[i + n] == '\\') ++n;
    if (i + n < line.size() && line[i + n] == '"') {
        arg->append(n / 2, '\\');
        if (n % 2 == 1) {
            arg->push_back('"');
            return i + n + 1;
        }
        return i + n;
    }
    arg->append(n, '\\');
    return i + n;
}

}  // namespace

std::vector<std::string> SplitCommandLine(const std::string& line) {
    std::vector<std::string> args;
    std::size_t i = 0;
    while (i < line.size() && IsBlank(line[i])) ++i;
    if (i >= line.size()) return args;
    std::string arg;
    i = ReadProgram(line, i, &arg);
    args.push_back(arg);

    arg.clear();
    bool started = false, quoted = false;
    while (i < line.size()) {
        char c = line[i];
        if (IsBlank(c) && !quoted) {
            if (started) args.push_back(arg);
            arg.clear();
            started = false;
            ++i;
        } else if (c == '\\') {
            started = true;
            i = ReadBackslashes(line, i, &arg);
        } else if (c == '"') {
            started = true;
            // Inside quotes a doubled quote is one literal quote and quoting goes on.
            if (quoted && i + 1 < line.size() && line[i + 1] == '"') {
                arg.push_back('"');
                i += 2;
            } else {
                quoted = !quoted;
                ++i;
            }
        } else {
            started = true;
            arg.push_back(c);
            ++i;
        }
    }
    if (started) args.push_back(arg);
    return args;
}

}  // namespace plat::proc

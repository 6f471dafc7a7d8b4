// The Windows command-line splitter over any text: [RUN] install commands come from content
// files. Besides not failing, the split must be faithful: quoting the arguments it gives by the
// same rules and splitting again gives them back.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "platform/process.h"

namespace {

// The quoting that CommandLineToArgvW undoes: backslashes double before a quote and at the
// end, a quote is escaped.
std::string Quote(const std::string& arg) {
    std::string out = "\"";
    std::size_t backslashes = 0;
    for (char c : arg) {
        if (c == '\\') {
            ++backslashes;
            continue;
        }
        out.append(c == '"' ? 2 * backslashes + 1 : backslashes, '\\');
        backslashes = 0;
        out += c;
    }
    out.append(2 * backslashes, '\\');
    return out + "\"";
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string line(reinterpret_cast<const char*>(data), size);
    const std::vector<std::string> args = plat::proc::SplitCommandLine(line);
    // A program name holding a quote cannot be written again: it has no escape.
    if (args.empty() || args[0].find('"') != std::string::npos) return 0;
    std::string again = "\"" + args[0] + "\"";
    for (std::size_t i = 1; i < args.size(); ++i) again += " " + Quote(args[i]);
    if (plat::proc::SplitCommandLine(again) != args) std::abort();
    return 0;
}

// The C run-time rules for splitting and merging Windows paths. Plain text work with no
// operating-system calls, so both backends share it and give the same results.
#include <string>

#include "platform/paths.h"

namespace plat::paths {

namespace {

bool IsSeparator(char c) { return c == '\\' || c == '/'; }

}  // namespace

PathParts SplitPath(const std::string& path) {
    PathParts parts;
    std::size_t start = 0;
    // Only a colon in the second place makes a drive; anything else is part of the folder.
    if (path.size() >= 2 && path[1] == ':') {
        parts.drive = path.substr(0, 2);
        start = 2;
    }
    std::size_t nameStart = start;
    std::size_t dot = std::string::npos;
    for (std::size_t i = start; i < path.size(); ++i) {
        if (IsSeparator(path[i])) {
            nameStart = i + 1;
        } else if (path[i] == '.') {
            dot = i;
        }
    }
    parts.dir = path.substr(start, nameStart - start);
    // A dot counts only in the last component; a leading one makes the whole name an extension.
    if (dot != std::string::npos && dot >= nameStart) {
        parts.fname = path.substr(nameStart, dot - nameStart);
        parts.ext = path.substr(dot);
    } else {
        parts.fname = path.substr(nameStart);
    }
    return parts;
}

std::string MakePath(const PathParts& parts) {
    std::string out;
    // As _makepath: the drive's letter alone, followed by the colon.
    if (!parts.drive.empty()) {
        out += parts.drive[0];
        out += ':';
    }
    if (!parts.dir.empty()) {
        out += parts.dir;
        if (!IsSeparator(parts.dir.back())) out += '\\';
    }
    out += parts.fname;
    if (!parts.ext.empty()) {
        if (parts.ext[0] != '.') out += '.';
        out += parts.ext;
    }
    return out;
}

std::string ComposePath(const std::string& first, const std::string& second, unsigned char flags) {
    const PathParts a = SplitPath(first);
    const PathParts b = SplitPath(second);
    // Bit n selects a part of the first path, bit n + 4 the same part of the second.
    auto pick = [flags](unsigned bit, const std::string& fromFirst, const std::string& fromSecond) {
        if (flags & (1u << bit)) return fromFirst;
        if (flags & (1u << (bit + 4))) return fromSecond;
        return std::string();
    };
    PathParts out;
    out.ext = pick(0, a.ext, b.ext);
    out.fname = pick(1, a.fname, b.fname);
    out.dir = pick(2, a.dir, b.dir);
    out.drive = pick(3, a.drive, b.drive);
    return MakePath(out);
}

std::string AddSeparator(const std::string& dir) {
    if (dir.empty() || dir.back() == '\\') return dir;
    return dir + '\\';
}

}  // namespace plat::paths

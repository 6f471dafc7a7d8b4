// The file tests FileExists and FileVersionAtLeast. A missing file or a file without version
// information is an answer (false), not a failure.
#include "diag/trace_log.h"
#include "expr/evaluation.h"
#include "expr/executors.h"
#include "expr/version_text.h"
#include "platform/files.h"
#include "platform/version_info.h"

namespace {

using Node = COverrideExpression;

constexpr std::size_t kMaxPath = 260;

// FindFirstFile semantics: the path may hold wild cards; any entry found will do.
bool PathFound(const std::string& path) { return !plat::files::Find(path).empty(); }

bool ReadFileVersion(const std::string& path, std::uint32_t* mostSignificant,
                     std::uint32_t* leastSignificant) {
    std::string block;
    plat::ver::VersionInfo info;
    if (!plat::ver::ReadBlock(path.substr(0, kMaxPath), &block) || !info.Parse(block)) {
        return false;
    }
    const plat::ver::FixedFileInfo* fixed = info.Fixed();
    if (fixed == nullptr) return false;
    *mostSignificant = fixed->fileVersionMS;
    *leastSignificant = fixed->fileVersionLS;
    return true;
}

bool VersionAtLeast(const std::string& path, const std::string& wanted) {
    std::uint32_t fileMS = 0, fileLS = 0, wantedMS = 0, wantedLS = 0;
    if (!PathFound(path) || !ReadFileVersion(path, &fileMS, &fileLS) ||
        !ParseVersionText(wanted, &wantedMS, &wantedLS)) {
        return false;
    }
    return fileMS > wantedMS || (fileMS == wantedMS && fileLS >= wantedLS);
}

}  // namespace

COverrideExpression ExecFileExists(const COverrideExpression& call, UpdateServices& services) {
    if (call.params.size() != 1) ThrowFailure("FileExists: Expects 1 parameters");
    if (!call.params[0].IsString()) ThrowFailure("FileExists: First Parameter must be string");
    Node value = Evaluate(call.params[0], services);
    if (!value.IsString()) ThrowFailure("FileExists: First Parameter Result not string");
    TRACE(g_TraceLog, "Checking for file: [%s]\n", value.stringValue.c_str());
    return Node::FromBool(PathFound(value.stringValue));
}

COverrideExpression ExecFileVersionAtLeast(const COverrideExpression& call,
                                           UpdateServices& services) {
    const std::string op = "ExecFileVersionAtLeast";
    if (call.params.size() != 2) ThrowFailure(op + ": Expects 2 parameters");
    if (!call.params[0].IsString()) ThrowFailure(op + ": First Parameter must be string");
    if (!call.params[1].IsString()) ThrowFailure(op + ": Second Parameter must be string");
    Node path = Evaluate(call.params[0], services);
    if (!path.IsString()) ThrowFailure(op + ": First Parameter Result not string");
    Node wanted = Evaluate(call.params[1], services);
    if (!wanted.IsString()) ThrowFailure(op + ": Second Parameter Result not string");
    TRACE(g_TraceLog, "Checking for file: [%s]\n", path.stringValue.c_str());
    return Node::FromBool(VersionAtLeast(path.stringValue, wanted.stringValue));
}

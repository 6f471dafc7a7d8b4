// `pexupdate compress IN OUT` and `pexupdate expand IN OUT`: make and expand SZDD files with
// Rivzip.dll, for publishers preparing downloads and for people checking one. The module is
// loaded by its bare name through the platform's loader, as the updater finds it (beside the
// program first), and called through its decorated entry names.
//
// IN and OUT are paths of the machine, as the updater sees files: Windows paths (C:\dl\a.ex_,
// relative ones against the current folder). A path that starts with '/' is a host path and is
// taken as the Windows path that names it (Z:\... outside the machine's drives).
#include <cstdio>
#include <string>
#include <vector>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/paths.h"
#include "rivzip/rivzip.h"
#include "tools/command.h"

namespace {

struct Operation {
    const char* name;        // command name
    const char* exportName;  // entry of Rivzip.dll
    const char* help;
};

const Operation kCompress{"compress", kRivzipCompressExport,
    "usage: pexupdate compress IN OUT\n\n"
    "Compresses the file IN into the SZDD file OUT (the format of COMPRESS.EXE and EXPAND.EXE),\n"
    "with Rivzip.dll. OUT is created or replaced. By custom OUT is IN with the last character of\n"
    "its name replaced by '_' (setup.exe -> setup.ex_); the header keeps that character.\n"};
const Operation kExpand{"expand", kRivzipExpandExport,
    "usage: pexupdate expand IN OUT\n\n"
    "Expands the SZDD file IN into OUT with Rivzip.dll, as the updater expands an LZW download.\n"
    "OUT is created or replaced; it is removed again when IN is damaged.\n"};
const char kPathHelp[] =
    "\nIN and OUT are Windows paths of the machine (C:\\dl\\setup.ex_, or relative to the current\n"
    "folder); a path starting with '/' is a host path. Exit code 0 on success, 1 on failure,\n"
    "2 for wrong usage.\n";

std::string MachinePath(const std::string& path) {
    return !path.empty() && path[0] == '/' ? plat::paths::ToWindows(path) : path;
}

const char* Reason(std::int32_t result) {
    switch (result) {
    case kRivzipBadHeader: return "not an SZDD file";
    case kRivzipTruncated: return "the compressed data is cut short";
    case kRivzipReadError: return "cannot read the input";
    case kRivzipWriteError: return "cannot write the output";
    case kRivzipLengthMismatch: return "the data does not match the length in its header";
    case kRivzipTooLarge: return "the input is 4 GiB or larger";
    case kRivzipNoMemory: return "out of memory";
    default: return "failed";
    }
}

// Opens both files and runs the entry; the files are closed before it returns.
int RunEntry(RivzipFileFn entry, const std::string& in, const std::string& out, const char* command) {
    plat::CFile source, destination;
    if (!source.Open(in, plat::CFile::modeRead | plat::CFile::shareDenyWrite)) {
        std::fprintf(stderr, "pexupdate %s: cannot open %s (error %u)\n", command, in.c_str(), plat::LastError());
        return 1;
    }
    if (!destination.Open(out, plat::CFile::modeCreate | plat::CFile::modeWrite | plat::CFile::shareExclusive)) {
        std::fprintf(stderr, "pexupdate %s: cannot create %s (error %u)\n", command, out.c_str(), plat::LastError());
        return 1;
    }
    std::int32_t result = entry(source, destination, nullptr, 0);
    destination.Close();
    if (result < 0) {
        std::fprintf(stderr, "pexupdate %s: %s: %s (%d)\n", command, in.c_str(), Reason(result), result);
        plat::files::Remove(out);
        return 1;
    }
    std::printf("%s -> %s: %d bytes\n", in.c_str(), out.c_str(), result);
    return 0;
}

int Run(const Operation& op, const std::vector<std::string>& args) {
    if (args.size() == 1 && (args[0] == "--help" || args[0] == "-h")) {
        std::printf("%s%s", op.help, kPathHelp);
        return 0;
    }
    if (args.size() != 2) {
        std::fprintf(stderr, "pexupdate %s: needs IN and OUT; see `pexupdate %s --help`\n", op.name, op.name);
        return 2;
    }
    plat::lib::Library module(plat::lib::Load(kRivzipModuleName));
    if (!module) {
        std::fprintf(stderr, "pexupdate %s: cannot load %s (error %u)\n", op.name, kRivzipModuleName, plat::LastError());
        return 1;
    }
    auto entry = reinterpret_cast<RivzipFileFn>(plat::lib::FindExport(module.get(), op.exportName));
    if (!entry) {
        std::fprintf(stderr, "pexupdate %s: %s has no entry %s\n", op.name, kRivzipModuleName, op.exportName);
        return 1;
    }
    return RunEntry(entry, MachinePath(args[0]), MachinePath(args[1]), op.name);
}

int RunCompress(const std::vector<std::string>& args) { return Run(kCompress, args); }
int RunExpand(const std::vector<std::string>& args) { return Run(kExpand, args); }

const pextool::CommandRegistrar kCompressCommand(
    {"compress", "compress a file into SZDD (COMPRESS.EXE) format with Rivzip.dll", RunCompress});
const pextool::CommandRegistrar kExpandCommand(
    {"expand", "expand an SZDD (COMPRESS.EXE) file with Rivzip.dll", RunExpand});

}  // namespace

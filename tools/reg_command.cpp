// `pexupdate reg`: the Windows `reg` command over the machine's registry, for people who look
// after a machine: query, add, delete, export and import, with reg's switches and messages.
#include <cctype>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>
#include <vector>

#include "platform/errors.h"
#include "platform/paths.h"
#include "platform/reg_data.h"
#include "platform/reg_file.h"
#include "platform/reg_path.h"
#include "platform/reg_query.h"
#include "platform/reg_transaction.h"
#include "platform/reg_tree.h"
#include "tools/command.h"

namespace {

namespace reg = plat::reg;

const char kDone[] = "The operation completed successfully.\n";

struct Args {
    std::vector<std::string> positional;
    bool hasV = false, ve = false, va = false, s = false, f = false, y = false;
    std::string v, t = "REG_SZ", d, separator = "\\0";
};

struct Verb {
    const char* name;
    const char* usage;
    const char* valueSwitches;  // switches followed by a value, e.g. "/v /t /d"
    const char* flagSwitches;
    int (*run)(const Args& args);
};

int Usage(const char* message) {
    std::fprintf(stderr, "ERROR: %s\nType \"pexupdate reg --help\" for usage.\n", message);
    return 2;
}

int Failure(long code) {
    if (code == plat::kErrorFileNotFound)
        std::fprintf(stderr, "ERROR: The system was unable to find the specified registry key"
                             " or value.\n");
    else if (code == plat::kErrorAccessDenied)
        std::fprintf(stderr, "ERROR: Access is denied.\n");
    else
        std::fprintf(stderr, "ERROR: The registry call failed with error %ld.\n", code);
    return 1;
}

bool HasWord(const char* list, const std::string& word) {
    std::istringstream words(list);
    for (std::string w; words >> w;)
        if (reg::NamesEqual(w, word)) return true;
    return false;
}

void SetFlag(Args* a, const std::string& sw) {
    std::string s = sw.substr(1);
    for (char& c : s) c = static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
    if (s == "ve") a->ve = true;
    if (s == "va") a->va = true;
    if (s == "s") a->s = true;
    if (s == "f") a->f = true;
    if (s == "y") a->y = true;
}

void SetValueSwitch(Args* a, const std::string& sw, const std::string& value) {
    char c = sw.size() == 2 ? static_cast<char>(sw[1] | 0x20) : '\0';
    if (c == 'v') {
        a->hasV = true;
        a->v = value;
    }
    if (c == 't') a->t = value;
    if (c == 'd') a->d = value;
    if (c == 's') a->separator = value;
}

// Like reg's own switches: a slash (or dash) and one or two letters. Anything longer, such as
// a host path /tmp/x.reg, is an argument.
bool LooksLikeSwitch(const std::string& arg) {
    if (arg.size() < 2 || arg.size() > 3 || (arg[0] != '/' && arg[0] != '-')) return false;
    for (size_t i = 1; i < arg.size(); ++i)
        if (!std::isalpha(static_cast<unsigned char>(arg[i]))) return false;
    return true;
}

bool ParseArgs(const Verb& verb, const std::vector<std::string>& in, Args* a, std::string* why) {
    for (size_t i = 1; i < in.size(); ++i) {
        const std::string& arg = in[i];
        if (!LooksLikeSwitch(arg)) {
            a->positional.push_back(arg);
        } else if (HasWord(verb.valueSwitches, "/" + arg.substr(1))) {
            if (i + 1 >= in.size()) {
                *why = "Invalid syntax: " + arg + " needs a value.";
                return false;
            }
            SetValueSwitch(a, arg, in[++i]);
        } else if (HasWord(verb.flagSwitches, "/" + arg.substr(1))) {
            SetFlag(a, arg);
        } else {
            *why = "Invalid syntax: unknown switch " + arg + ".";
            return false;
        }
    }
    return true;
}

bool Confirm(const std::string& question) {
    std::printf("%s (Yes/No)? ", question.c_str());
    std::fflush(stdout);
    std::string answer;
    std::getline(std::cin, answer);
    bool yes = !answer.empty() && (answer[0] == 'y' || answer[0] == 'Y');
    if (!yes) std::printf("The operation was cancelled.\n");
    return yes;
}

bool KeyArg(const Args& a, size_t count, reg::KeyPath* key, int* rc) {
    if (a.positional.size() != count) {
        *rc = Usage("Invalid syntax: wrong number of arguments.");
        return false;
    }
    if (!reg::ParseKeyPath(a.positional[0], key)) {
        *rc = Usage("Invalid key name: it must start with HKLM, HKCU or HKCR.");
        return false;
    }
    return true;
}

// A file argument: a Windows path (with a drive letter) lies on the machine, others on the host.
std::string HostFile(const std::string& arg) {
    bool windows = arg.size() >= 2 && arg[1] == ':';
    return windows ? plat::paths::ToHost(arg) : arg;
}

int Query(const Args& a) {
    reg::KeyPath key;
    int rc = 0;
    if (!KeyArg(a, 1, &key, &rc)) return rc;
    if (a.hasV && a.ve) return Usage("Invalid syntax: /v and /ve exclude each other.");
    reg::QueryOptions options;
    options.recursive = a.s;
    options.oneValue = a.hasV || a.ve;
    options.valueName = a.v;
    std::string out;
    long code = reg::Query(key, options, &out);
    std::fputs(out.c_str(), stdout);
    return code ? Failure(code) : 0;
}

int Add(const Args& a) {
    reg::KeyPath key;
    int rc = 0;
    if (!KeyArg(a, 1, &key, &rc)) return rc;
    if (a.hasV && a.ve) return Usage("Invalid syntax: /v and /ve exclude each other.");
    std::uint32_t type = 0;
    if (!reg::TypeFromName(a.t, &type)) return Usage(("Invalid type " + a.t + ".").c_str());
    std::string data, why;
    if (!reg::DataFromText(type, a.d, a.separator, &data, &why)) return Usage(why.c_str());
    reg::Key k;
    if (long code = reg::CreateKey(key.root, key.subKey, reg::kKeyAllAccess, k.out(), nullptr))
        return Failure(code);
    if (a.hasV || a.ve) {
        bool exists = reg::QueryValue(k.get(), a.v, nullptr, nullptr, nullptr) == 0;
        std::string shown = a.ve ? std::string("(Default)") : a.v;
        if (exists && !a.f && !Confirm("Value " + shown + " exists, overwrite")) return 1;
        long code = reg::SetValue(k.get(), a.v, type,
                                  reinterpret_cast<const std::uint8_t*>(data.data()),
                                  static_cast<std::uint32_t>(data.size()));
        if (code) return Failure(code);
    }
    std::printf("%s", kDone);
    return 0;
}

long DeleteAllValues(const reg::KeyPath& key) {
    reg::Key k;
    if (long code = reg::OpenKey(key.root, key.subKey, reg::kKeyAllAccess, k.out())) return code;
    std::vector<reg::Value> values;
    if (long code = reg::ReadValues(k.get(), &values)) return code;
    for (const reg::Value& v : values)
        if (long code = reg::DeleteValue(k.get(), v.name)) return code;
    return 0;
}

long DeleteWhat(const Args& a, const reg::KeyPath& key) {
    reg::Transaction batch;
    if (long code = batch.Status()) return code;
    long code = 0;
    if (a.va) {
        code = DeleteAllValues(key);
    } else if (a.hasV || a.ve) {
        reg::Key k;
        code = reg::OpenKey(key.root, key.subKey, reg::kKeyAllAccess, k.out());
        if (code == 0) code = reg::DeleteValue(k.get(), a.v);
    } else {
        code = reg::DeleteTree(key.root, key.subKey);
    }
    return code ? code : batch.Commit();
}

int Delete(const Args& a) {
    reg::KeyPath key;
    int rc = 0;
    if (!KeyArg(a, 1, &key, &rc)) return rc;
    if (int(a.hasV) + int(a.ve) + int(a.va) > 1)
        return Usage("Invalid syntax: choose one of /v, /ve and /va.");
    bool wholeKey = !a.hasV && !a.ve && !a.va;
    if (wholeKey && key.subKey.empty()) return Usage("A root key cannot be deleted.");
    std::string what = wholeKey ? "the registry key " + key.FullName()
                       : a.va   ? "all values under the registry key " + key.FullName()
                                : "the registry value " + (a.ve ? std::string("(Default)") : a.v);
    if (!a.f && !Confirm("Delete " + what)) return 1;
    if (long code = DeleteWhat(a, key)) return Failure(code);
    std::printf("%s", kDone);
    return 0;
}

int Export(const Args& a) {
    reg::KeyPath key;
    int rc = 0;
    if (!KeyArg(a, 2, &key, &rc)) return rc;
    std::string file = HostFile(a.positional[1]);
    bool exists = std::ifstream(file).good();
    if (exists && !a.y && !Confirm("File " + a.positional[1] + " already exists. Overwrite"))
        return 1;
    std::string bytes;
    if (long code = reg::ExportRegFile(key, &bytes)) return Failure(code);
    std::ofstream out(file, std::ios::binary | std::ios::trunc);
    if (!(out << bytes) || !out.flush()) {
        std::fprintf(stderr, "ERROR: Cannot write the file %s.\n", a.positional[1].c_str());
        return 1;
    }
    std::printf("%s", kDone);
    return 0;
}

int Import(const Args& a) {
    if (a.positional.size() != 1) return Usage("Invalid syntax: import takes one file.");
    std::ifstream in(HostFile(a.positional[0]), std::ios::binary);
    std::ostringstream bytes;
    if (!in || !(bytes << in.rdbuf())) {
        std::fprintf(stderr, "ERROR: Cannot read the file %s.\n", a.positional[0].c_str());
        return 1;
    }
    reg::RegFileError error;
    if (reg::ImportRegFile(bytes.str(), &error)) {
        std::fprintf(stderr, "ERROR: %s", a.positional[0].c_str());
        if (error.line) std::fprintf(stderr, ", line %d", error.line);
        std::fprintf(stderr, ": %s\nNothing was imported.\n", error.message.c_str());
        return 1;
    }
    std::printf("%s", kDone);
    return 0;
}

const Verb kVerbs[] = {
    {"query",
     "reg query KEY [/v NAME | /ve] [/s]\n"
     "  Shows the values of KEY and its subkeys. /v NAME shows one value, /ve the default\n"
     "  value, /s every key below KEY (with /v: every key holding the value).\n",
     "/v", "/ve /s", Query},
    {"add",
     "reg add KEY [/v NAME | /ve] [/t TYPE] [/s SEPARATOR] [/d DATA] [/f]\n"
     "  Creates KEY and, with /v or /ve, sets a value. TYPE is REG_SZ (the default),\n"
     "  REG_EXPAND_SZ, REG_DWORD (decimal or 0x hex), REG_BINARY (hex digits),\n"
     "  REG_MULTI_SZ (texts separated by SEPARATOR, by default \\0) or REG_NONE.\n"
     "  /f overwrites an existing value without asking.\n",
     "/v /t /d /s", "/ve /f", Add},
    {"delete",
     "reg delete KEY [/v NAME | /ve | /va] [/f]\n"
     "  Deletes KEY with everything below it, or only the value NAME (/v), the default\n"
     "  value (/ve) or all values of KEY (/va). /f deletes without asking.\n",
     "/v", "/ve /va /f", Delete},
    {"export",
     "reg export KEY FILE [/y]\n"
     "  Writes KEY and everything below it to FILE as the Windows registry editor does\n"
     "  (UTF-16LE). /y overwrites an existing FILE without asking.\n",
     "", "/y", Export},
    {"import",
     "reg import FILE\n"
     "  Applies a .reg file (version 5 or REGEDIT4; UTF-16LE, UTF-8 or single-byte),\n"
     "  all of it or, when a line is malformed or a change fails, nothing.\n",
     "", "", Import},
};

const char kIntro[] =
    "usage: pexupdate [--machine DIR] reg query|add|delete|export|import ...\n"
    "KEY is ROOT\\path, ROOT one of HKLM, HKCU, HKCR (or HKEY_LOCAL_MACHINE,\n"
    "HKEY_CURRENT_USER, HKEY_CLASSES_ROOT). FILE is a host path, or C:\\... on the machine.\n\n";

bool WantsHelp(const std::string& arg) { return arg == "--help" || arg == "-h" || arg == "/?"; }

void PrintHelp(FILE* out) {
    std::fputs(kIntro, out);
    for (const Verb& v : kVerbs) std::fprintf(out, "%s\n", v.usage);
}

int RunReg(const std::vector<std::string>& args) {
    if (args.empty()) {
        std::fprintf(stderr, "ERROR: Invalid syntax: name an operation.\n");
        PrintHelp(stderr);
        return 2;
    }
    if (WantsHelp(args[0])) {
        PrintHelp(stdout);
        return 0;
    }
    for (const Verb& verb : kVerbs) {
        if (!reg::NamesEqual(args[0], verb.name)) continue;
        if (args.size() > 1 && WantsHelp(args[1])) return std::printf("%s", verb.usage), 0;
        Args parsed;
        std::string why;
        if (!ParseArgs(verb, args, &parsed, &why)) return Usage(why.c_str());
        return verb.run(parsed);
    }
    return Usage(("Invalid operation " + args[0] + ".").c_str());
}

const pextool::CommandRegistrar kRegister(
    {"reg", "query and change the registry (query, add, delete, export, import)", RunReg});

}  // namespace

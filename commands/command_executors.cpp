// The platform work of the install commands: the executors of CommandString.
#include <cstdint>
#include <cstdio>
#include <string>

#include "commands/command_string.h"
#include "commands/platform_utilities.h"
#include "commands/registry_command.h"
#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/paths.h"
#include "platform/registry.h"
#include "platform/version_info.h"

namespace {

// Removes one pair of enclosing double quotes, so that quoted paths with blanks work.
std::string StripQuotes(const std::string& text) {
    if (text.size() >= 2 && text.front() == '"' && text.back() == '"') {
        return text.substr(1, text.size() - 2);
    }
    return text;
}

// The file a deletion item names: a bare file name lies in the base directory, anything with
// a drive or a folder is taken as it is.
std::string DeletionPath(const std::string& directory, const std::string& parameter) {
    const plat::paths::PathParts parts = plat::paths::SplitPath(parameter);
    std::string path = parameter;
    if (parts.drive.empty() && parts.dir.empty()) {
        path = plat::paths::AddSeparator(directory) + StripQuotes(parameter);
    }
    return StripQuotes(path);
}

// Libraries announce self-registration with the "OLESelfRegister" string of their first
// translation; its content does not matter.
bool IsSelfRegistering(const std::string& path) {
    plat::ver::VersionInfo info;
    if (!plat::ver::Read(path, &info) || info.Translations().empty()) return false;
    const plat::ver::Translation& first = info.Translations().front();
    char subBlock[64];
    std::snprintf(subBlock, sizeof subBlock, "\\StringFileInfo\\%04hX%04hX\\OLESelfRegister",
                  first.language, first.codePage);
    std::string value;
    return info.QueryString(subBlock, &value);
}

// Loads the library, calls its DllRegisterServer and unloads it again. Only exactly 0
// (S_OK) counts: S_FALSE and other success codes are treated as failure.
bool CallDllRegisterServer(const std::string& path) {
    using RegisterServer = std::int32_t (*)();
    const plat::lib::Library library(plat::lib::Load(path));
    if (!library) return false;
    const auto entry =
        reinterpret_cast<RegisterServer>(plat::lib::FindExport(library.get(), "DllRegisterServer"));
    return entry && entry() == 0;
}

}  // namespace

void CommandString::ExecuteRun(std::string parameter) {
    const std::string workingDirectory = plat::paths::AddSeparator(Directory());
    if (!RunProcess(parameter, workingDirectory, true, RunTimeoutMs(), true)) {
        throw "process failed";
    }
}

void CommandString::ExecuteDel(std::string parameter) {
    const std::string path = DeletionPath(Directory(), parameter);
    if (!plat::files::Remove(path)) throw plat::CFileException(plat::LastError(), path);
}

void CommandString::ExecuteRegSvr(std::string parameter) {
    const std::string path = StripQuotes(parameter);
    // A library that does not declare self-registration is never loaded, so none of its code
    // runs on an update's behalf.
    if (!IsSelfRegistering(path) || !CallDllRegisterServer(path)) {
        throw "Registration Failed!";
    }
}

void CommandString::ExecuteDelIfExists(std::string parameter) {
    const std::string path = DeletionPath(Directory(), parameter);
    if (plat::files::Remove(path)) return;
    const std::uint32_t error = plat::LastError();
    // A file (or folder) that is not there has nothing to delete: that is what "if exists" asks.
    if (error == plat::kErrorFileNotFound || error == plat::kErrorPathNotFound) return;
    if (error != plat::kErrorSuccess) throw plat::CFileException(error, path);
}

void CommandString::ExecuteRegistry(std::string parameter) {
    RegistryAssignment assignment;
    if (const char* message = ParseRegistryAssignment(parameter, &assignment)) throw message;

    const plat::reg::HKey hive = assignment.root == RegistryRoot::LocalMachine
                                     ? plat::reg::kLocalMachine
                                     : plat::reg::kCurrentUser;
    plat::reg::Key key;
    if (plat::reg::CreateKey(hive, assignment.subKey, plat::reg::kKeyAllAccess, key.out(),
                             nullptr) != plat::kErrorSuccess) {
        throw "Unable to create requested registry key.";
    }

    long status = 0;
    if (assignment.type == RegistryDataType::Dword) {
        const auto number = static_cast<std::uint32_t>(RegistryDwordFromText(assignment.data));
        const std::uint8_t bytes[4] = {
            static_cast<std::uint8_t>(number), static_cast<std::uint8_t>(number >> 8),
            static_cast<std::uint8_t>(number >> 16), static_cast<std::uint8_t>(number >> 24)};
        status = plat::reg::SetValue(key.get(), assignment.valueName, plat::reg::kRegDword, bytes,
                                     sizeof bytes);
    } else if (assignment.type == RegistryDataType::String) {
        // Stored with its terminating zero, as the profile writer stores its texts.
        status = plat::reg::SetValue(
            key.get(), assignment.valueName, plat::reg::kRegSz,
            reinterpret_cast<const std::uint8_t*>(assignment.data.c_str()),
            static_cast<std::uint32_t>(assignment.data.size() + 1));
    } else {
        throw "Invalid Registration Parameter - Bad Data Type.";
    }
    if (status != plat::kErrorSuccess) throw "Unable to create requested registry entry.";
}

// The install commands on an emulated machine: real programs (pextestprog), real files, the
// registry, and the test modules PexSelfReg.dll, PexNoSelfReg.dll and PexNoVersion.dll, all
// built beside this test program. The list rules (TRY-, traces) are command_string_test's; the
// golden run install_commands runs every kind of command within a product run.
#include "commands/command_string.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "platform/cfile.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/case_file.h"
#include "tests/support/environment.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace reg = plat::reg;

namespace {

std::string AppFolder() {
    const std::string app = plat::files::ModuleFileName(nullptr);
    return app.substr(0, app.find_last_of('\\') + 1);
}

// "ok", the message a command without TRY- throws, or the OS error of a file exception.
std::string Outcome(const std::string& commands, const std::string& base = "C:\\App") {
    try {
        return CommandString(base).Execute(commands) ? "ok" : "failed";
    } catch (const char* message) {
        return message;
    } catch (const plat::CFileException& e) {
        return "os error " + std::to_string(e.OsError());
    }
}

// A file's or a registry value's state after a command, in the form the case file gives it.
std::string ReadBack(const pextest::Case& c) {
    if (c.fields.size() == 4) return plat::files::Exists(c[2]) ? "kept" : "gone";
    const reg::HKey root = c[2] == "HKCU" ? reg::kCurrentUser : reg::kLocalMachine;
    std::string bytes;
    std::uint32_t type = 0;
    if (!pextest::GetRegValue(root, c[3], c[4], &bytes, &type)) {
        return pextest::RegKeyExists(root, c[3]) && c[5] == "key only" ? "key only" : "missing";
    }
    return std::string(type == reg::kRegDword ? "dword" : type == reg::kRegSz ? "string" : "other") + " | " + bytes;
}

TEST(Executors, CommandsAndWhatTheyLeave) {
    pextest::TestMachine m;
    for (const char* file : {"C:\\App\\old.dll", "C:\\App\\my file.txt", "C:\\App\\there.txt", "C:\\old.dll",
                             "C:\\Program Files\\Maker\\stale.txt", "C:\\App\\locked.dll"}) {
        m.WriteFile(file, "x");
    }
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\locked.dll", plat::files::kAttrReadOnly));
    // The test modules carry their own copy of the platform, which finds the machine as a child
    // process would: through PEX_MACHINE.
    pextest::SetEnvironment("PEX_MACHINE", m.Root());
    for (const pextest::Case& c : pextest::ReadCases("commands/cases/executor_commands.txt")) {
        SCOPED_TRACE(c.where);
        std::string command = c[0];
        if (command.find("<app>") != std::string::npos) command.replace(command.find("<app>"), 5, AppFolder());
        EXPECT_EQ(Outcome(command), c[1]);
        if (c.fields.size() > 2) {
            EXPECT_EQ(ReadBack(c), c.fields.size() == 7 ? c[5] + " | " + pextest::Unescape(c[6]) : c.fields.back());
        }
    }
    pextest::RemoveEnvironment("PEX_MACHINE");
}

// Past the time-out the program is left running; it ends by itself soon after the test.
TEST(Executors, AProgramThatDoesNotEndFails) {
    pextest::TestMachine m;
    CommandString::SetRunTimeoutMs(1);
    EXPECT_EQ(Outcome("[RUN] pextestprog sleep 500", "C:\\"), "process failed");
    CommandString::SetRunTimeoutMs(CommandString::kDefaultRunTimeoutMs);
}

// A refused registry write: of the new key first, then of the value under an existing key.
TEST(Executors, RefusedRegistryWrites) {
    pextest::TestMachine m;
    pextest::SetRegText(reg::kCurrentUser, "Existing", "Other", "x");
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(Outcome("[REGISTRY] (DWORD)HKCU\\New\\Name=1"), "Unable to create requested registry key.");
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(Outcome("[REGISTRY] (STRING)HKCU\\Existing\\Name=1"), "Unable to create requested registry entry.");
    plat::fault::Clear();
}

}  // namespace

// The install commands on an emulated machine: real programs (pextestprog), real files, the
// registry, and the test modules PexSelfReg.dll, PexNoSelfReg.dll and PexNoVersion.dll, all
// built beside this test program. The list rules (TRY-, traces) are command_string_test's.
#include "commands/command_string.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "platform/cfile.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/environment.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace reg = plat::reg;

namespace {

std::string AppFolder() {
    const std::string app = plat::files::ModuleFileName(nullptr);
    return app.substr(0, app.find_last_of('\\') + 1);
}

// The message a command without TRY- throws; empty when it runs through.
std::string MessageOf(const std::string& commands, const std::string& base = "C:\\App") {
    try {
        CommandString(base).Execute(commands);
    } catch (const char* message) {
        return message;
    }
    return "";
}

// The OS error of the file exception a deletion throws; 0 when it runs through.
std::uint32_t FileErrorOf(const std::string& commands) {
    try {
        CommandString("C:\\App").Execute(commands);
    } catch (const plat::CFileException& e) {
        return e.OsError();
    }
    return 0;
}

// A value's bytes as read back from the registry, after checking its type; empty when missing.
std::string ReadValue(reg::HKey hive, const std::string& key, const std::string& name, std::uint32_t expectedType) {
    std::string bytes;
    std::uint32_t type = 0;
    if (!pextest::GetRegValue(hive, key, name, &bytes, &type)) return "";
    EXPECT_EQ(type, expectedType) << name;
    return bytes;
}
// The four bytes of a DWORD value (little-endian, as Windows stores it).
std::string Dword(std::uint32_t n) {
    return {static_cast<char>(n), static_cast<char>(n >> 8), static_cast<char>(n >> 16), static_cast<char>(n >> 24)};
}
// A string value's bytes: its text with the terminating zero.
std::string Sz(const std::string& text) { return text + '\0'; }

TEST(ExecuteRun, RunsInTheBaseDirectoryIgnoringTheExitCodeAndFailsWhenAProgramDoesNotEnd) {
    pextest::TestMachine m;
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\App"));
    EXPECT_TRUE(CommandString("C:\\App\\").Execute("[RUN] pextestprog mark ran.txt; [RUN] pextestprog exit 7"));
    EXPECT_EQ(m.ReadFile("C:\\App\\ran.txt"), "marked\n");
    EXPECT_FALSE(plat::files::Exists("C:\\ran.txt"));
    EXPECT_EQ(MessageOf("[RUN] nosuchprogram.exe; [RUN] pextestprog mark after.txt"), "process failed");
    EXPECT_FALSE(plat::files::Exists("C:\\App\\after.txt"));

    // Past the time-out the program is left running; it ends by itself soon after the test.
    CommandString::SetRunTimeoutMs(1);
    EXPECT_EQ(MessageOf("[RUN] pextestprog sleep 500", "C:\\"), "process failed");
    CommandString::SetRunTimeoutMs(CommandString::kDefaultRunTimeoutMs);
}

TEST(ExecuteDel, BareNamesLieInTheBaseDirectoryAndFailuresThrowTheSystemError) {
    pextest::TestMachine m;
    const char* const deleted[] = {"C:\\App\\old.dll", "C:\\App\\my file.txt", "C:\\Program Files\\Maker\\stale.txt",
                                   "C:\\App\\there.txt"};
    for (const char* file : deleted) m.WriteFile(file, "x");
    m.WriteFile("C:\\old.dll", "x");
    EXPECT_TRUE(CommandString("C:\\App").Execute(
        "[DEL] old.dll; [DEL] \"my file.txt\"; [DEL] \"C:\\Program Files\\Maker\\stale.txt\";"
        "[DELIFEXISTS] there.txt; [DELIFEXISTS] missing.txt; [DELIFEXISTS] C:\\Nowhere\\missing.txt"));
    for (const char* file : deleted) EXPECT_FALSE(plat::files::Exists(file)) << file;
    EXPECT_TRUE(plat::files::Exists("C:\\old.dll"));

    m.WriteFile("C:\\App\\locked.dll", "x");
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\locked.dll", plat::files::kAttrReadOnly));
    EXPECT_EQ(FileErrorOf("[DEL] missing.dll"), 2u);
    EXPECT_EQ(FileErrorOf("[DEL] C:\\Nowhere\\missing.dll"), 3u);
    EXPECT_EQ(FileErrorOf("[DEL] locked.dll"), 5u);
    EXPECT_EQ(FileErrorOf("[DELIFEXISTS] locked.dll"), 5u);
    EXPECT_TRUE(plat::files::Exists("C:\\App\\locked.dll"));
}

TEST(ExecuteRegistry, WritesNumbersAndTextsAsReadBack) {
    pextest::TestMachine m;
    EXPECT_TRUE(CommandString("C:\\App").Execute(
        "[REGISTRY] (DWORD)HKLM\\Software\\Maker\\Product\\Flags=1;"
        "[REGISTRY] (dword)hklm\\Software\\Maker\\Product\\Negative=-1;"
        "[REGISTRY] (DWORD)HKLM\\Software\\Maker\\Product\\Word=abc;"
        "[REGISTRY] (string)hkcu\\Software\\Maker\\Name=Value;"
        "[REGISTRY] (STRING)HKCU/Software/Maker/Url=http://host/path;"
        "[REGISTRY] (STRING)HKCU\\Software\\Maker\\=default"));
    const std::string product = "Software\\Maker\\Product";
    EXPECT_EQ(ReadValue(reg::kLocalMachine, product, "Flags", reg::kRegDword), Dword(1));
    EXPECT_EQ(ReadValue(reg::kLocalMachine, product, "Negative", reg::kRegDword), Dword(0xFFFFFFFFu));
    EXPECT_EQ(ReadValue(reg::kLocalMachine, product, "Word", reg::kRegDword), Dword(0));
    EXPECT_EQ(ReadValue(reg::kCurrentUser, "Software\\Maker", "Name", reg::kRegSz), Sz("Value"));
    EXPECT_EQ(ReadValue(reg::kCurrentUser, "Software\\Maker", "Url", reg::kRegSz), Sz("http:\\\\host\\path"));
    EXPECT_EQ(ReadValue(reg::kCurrentUser, "Software\\Maker", "", reg::kRegSz), Sz("default"));
}

TEST(ExecuteRegistry, FailuresAfterParsing) {
    pextest::TestMachine m;
    // Parsing defects come out unchanged (their texts are the parser's own tests).
    EXPECT_EQ(MessageOf("[REGISTRY] (DWORD)HKCR\\K\\N=1"), "Invalid Registration Parameter - Bad Root Key.");

    // An unknown type is found only after the key exists, and the key stays.
    EXPECT_EQ(MessageOf("[REGISTRY] (BINARY)HKCU\\Binary\\Name=1"), "Invalid Registration Parameter - Bad Data Type.");
    EXPECT_TRUE(pextest::RegKeyExists(reg::kCurrentUser, "Binary"));

    // A refused registry write: of the new key first, then of the value under the existing key.
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(MessageOf("[REGISTRY] (DWORD)HKCU\\New\\Name=1"), "Unable to create requested registry key.");
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(MessageOf("[REGISTRY] (STRING)HKCU\\Binary\\Name=1"), "Unable to create requested registry entry.");
    plat::fault::Clear();
}

TEST(ExecuteRegSvr, OnlyDeclaredSelfRegisteringLibrariesAreRegistered) {
    pextest::TestMachine m;
    // The test modules carry their own copy of the platform, which finds the machine as a child
    // process would: through PEX_MACHINE.
    pextest::SetEnvironment("PEX_MACHINE", m.Root());
    const auto registered = [] {
        return ReadValue(reg::kLocalMachine, "Software\\Vantric\\Test", "RegisteredBy", reg::kRegSz);
    };
    // Exports DllRegisterServer but lacks "OLESelfRegister": never loaded, so never called.
    EXPECT_EQ(MessageOf("[REGSVR] " + AppFolder() + "PexNoSelfReg.dll"), "Registration Failed!");
    EXPECT_EQ(MessageOf("[REGSVR] " + AppFolder() + "PexNoVersion.dll"), "Registration Failed!");
    EXPECT_EQ(MessageOf("[REGSVR] C:\\App\\missing.dll"), "Registration Failed!");
    EXPECT_EQ(registered(), "");

    EXPECT_TRUE(CommandString("C:\\App").Execute("[REGSVR] \"" + AppFolder() + "PexSelfReg.dll\""));
    EXPECT_EQ(registered(), Sz("PexSelfReg"));
    pextest::RemoveEnvironment("PEX_MACHINE");
}

}  // namespace

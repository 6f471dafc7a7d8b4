// The install commands on an emulated machine: real programs (pextestprog), real files, the
// registry, and the test modules PexSelfReg.dll, PexNoSelfReg.dll and PexNoVersion.dll, all
// built beside this test program.
#include "commands/command_string.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <string>

#include "platform/cfile.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/registry.h"
#include "tests/support/environment.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

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
std::string ReadValue(plat::reg::HKey hive, const std::string& key, const std::string& name,
                      std::uint32_t expectedType) {
    plat::reg::Key opened;
    std::uint8_t data[256];
    std::uint32_t size = sizeof data, type = 0;
    if (plat::reg::OpenKey(hive, key, plat::reg::kKeyRead, opened.out()) != 0 ||
        plat::reg::QueryValue(opened.get(), name, &type, data, &size) != 0) {
        return "";
    }
    EXPECT_EQ(type, expectedType) << name;
    return std::string(reinterpret_cast<const char*>(data), size);
}
// The four bytes of a DWORD value (little-endian, as Windows stores it).
std::string Dword(std::uint32_t n) {
    return {static_cast<char>(n), static_cast<char>(n >> 8), static_cast<char>(n >> 16), static_cast<char>(n >> 24)};
}
// A string value's bytes: its text with the terminating zero.
std::string Sz(const std::string& text) { return text + '\0'; }

// The test modules carry their own copy of the platform, which finds the machine as a child
// process would: through PEX_MACHINE.
class MachineForModules {
public:
    explicit MachineForModules(const pextest::TestMachine& m) { pextest::SetEnvironment("PEX_MACHINE", m.Root()); }
    ~MachineForModules() { pextest::RemoveEnvironment("PEX_MACHINE"); }
};

// Shortens the ten-minute wait of [RUN] for one test.
class ShortRunTimeout {
public:
    explicit ShortRunTimeout(std::uint32_t ms) { CommandString::SetRunTimeoutMs(ms); }
    ~ShortRunTimeout() { CommandString::SetRunTimeoutMs(CommandString::kDefaultRunTimeoutMs); }
};

TEST(ExecuteRun, RunsInTheBaseDirectoryAndIgnoresTheExitCode) {
    pextest::TestMachine m;
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\App"));
    EXPECT_TRUE(CommandString("C:\\App").Execute("[RUN] pextestprog mark ran.txt; [RUN] pextestprog exit 7"));
    EXPECT_EQ(m.ReadFile("C:\\App\\ran.txt"), "marked\n");
    EXPECT_FALSE(plat::files::Exists("C:\\ran.txt"));
}

TEST(ExecuteRun, AProgramThatCannotStartFails) {
    pextest::TestMachine m;
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\App"));
    EXPECT_EQ(MessageOf("[RUN] nosuchprogram.exe; [RUN] pextestprog mark after.txt"), "process failed");
    EXPECT_FALSE(plat::files::Exists("C:\\App\\after.txt"));

    pextest::TraceCapture trace;
    EXPECT_FALSE(CommandString("C:\\App\\").Execute("[TRY-RUN] nosuchprogram.exe; [RUN] pextestprog mark after.txt"));
    EXPECT_TRUE(plat::files::Exists("C:\\App\\after.txt"));
    EXPECT_EQ(trace.Lines().at(2), "Ignoring Exception [process failed] from Command [[TRY-RUN]].");
}

TEST(ExecuteRun, AProgramOutlivingTheTimeOutFails) {
    pextest::TestMachine m;
    ShortRunTimeout shortWait(1);
    // The program is left running; it ends by itself soon after the test.
    EXPECT_EQ(MessageOf("[RUN] pextestprog sleep 500", "C:\\"), "process failed");
}

TEST(ExecuteDel, BareNamesLieInTheBaseDirectoryOtherPathsAsGiven) {
    pextest::TestMachine m;
    m.WriteFile("C:\\App\\old.dll", "x");
    m.WriteFile("C:\\App\\my file.txt", "x");
    m.WriteFile("C:\\Program Files\\Maker\\stale.txt", "x");
    m.WriteFile("C:\\old.dll", "x");
    EXPECT_TRUE(CommandString("C:\\App").Execute(
        "[DEL] old.dll; [DEL] \"my file.txt\"; [DEL] \"C:\\Program Files\\Maker\\stale.txt\""));
    EXPECT_FALSE(plat::files::Exists("C:\\App\\old.dll"));
    EXPECT_FALSE(plat::files::Exists("C:\\App\\my file.txt"));
    EXPECT_FALSE(plat::files::Exists("C:\\Program Files\\Maker\\stale.txt"));
    EXPECT_TRUE(plat::files::Exists("C:\\old.dll"));
}

TEST(ExecuteDel, FailuresThrowTheFileExceptionWithTheSystemError) {
    pextest::TestMachine m;
    m.WriteFile("C:\\App\\locked.dll", "x");
    ASSERT_TRUE(plat::files::SetAttributes("C:\\App\\locked.dll", plat::files::kAttrReadOnly));
    EXPECT_EQ(FileErrorOf("[DEL] missing.dll"), 2u);
    EXPECT_EQ(FileErrorOf("[DEL] C:\\Nowhere\\missing.dll"), 3u);
    EXPECT_EQ(FileErrorOf("[DEL] locked.dll"), 5u);
    EXPECT_EQ(FileErrorOf("[DELIFEXISTS] locked.dll"), 5u);
    EXPECT_TRUE(plat::files::Exists("C:\\App\\locked.dll"));

    pextest::TraceCapture trace;
    EXPECT_FALSE(CommandString("C:\\App").Execute("[TRY-DEL] locked.dll"));
    EXPECT_EQ(trace.Lines().at(2), "Ignoring unknown Exception from Command [[TRY-DEL]].");
}

TEST(ExecuteDelIfExists, NothingToDeleteIsSuccess) {
    pextest::TestMachine m;
    m.WriteFile("C:\\App\\there.txt", "x");
    EXPECT_TRUE(CommandString("C:\\App").Execute(
        "[DELIFEXISTS] there.txt; [DELIFEXISTS] missing.txt; [DELIFEXISTS] C:\\Nowhere\\missing.txt"));
    EXPECT_FALSE(plat::files::Exists("C:\\App\\there.txt"));
}

TEST(ExecuteRegistry, WritesNumbersAndTextsAsReadBack) {
    pextest::TestMachine m;
    using plat::reg::kCurrentUser;
    using plat::reg::kLocalMachine;
    using plat::reg::kRegDword;
    using plat::reg::kRegSz;
    EXPECT_TRUE(CommandString("C:\\App").Execute(
        "[REGISTRY] (DWORD)HKLM\\Software\\Maker\\Product\\Flags=1;"
        "[REGISTRY] (dword)hklm\\Software\\Maker\\Product\\Negative=-1;"
        "[REGISTRY] (DWORD)HKLM\\Software\\Maker\\Product\\Word=abc;"
        "[REGISTRY] (string)hkcu\\Software\\Maker\\Name=Value;"
        "[REGISTRY] (STRING)HKCU/Software/Maker/Url=http://host/path;"
        "[REGISTRY] (STRING)HKCU\\Software\\Maker\\=default"));
    const std::string product = "Software\\Maker\\Product";
    EXPECT_EQ(ReadValue(kLocalMachine, product, "Flags", kRegDword), Dword(1));
    EXPECT_EQ(ReadValue(kLocalMachine, product, "Negative", kRegDword), Dword(0xFFFFFFFFu));
    EXPECT_EQ(ReadValue(kLocalMachine, product, "Word", kRegDword), Dword(0));
    EXPECT_EQ(ReadValue(kCurrentUser, "Software\\Maker", "Name", kRegSz), Sz("Value"));
    EXPECT_EQ(ReadValue(kCurrentUser, "Software\\Maker", "Url", kRegSz), Sz("http:\\\\host\\path"));
    EXPECT_EQ(ReadValue(kCurrentUser, "Software\\Maker", "", kRegSz), Sz("default"));
}

TEST(ExecuteRegistry, FailuresAfterParsing) {
    pextest::TestMachine m;
    // Parsing defects come out unchanged (their texts are the parser's own tests).
    EXPECT_EQ(MessageOf("[REGISTRY] (DWORD)HKCR\\K\\N=1"), "Invalid Registration Parameter - Bad Root Key.");

    // An unknown type is found only after the key exists, and the key stays.
    EXPECT_EQ(MessageOf("[REGISTRY] (BINARY)HKCU\\Binary\\Name=1"), "Invalid Registration Parameter - Bad Data Type.");
    plat::reg::Key created;
    EXPECT_EQ(plat::reg::OpenKey(plat::reg::kCurrentUser, "Binary", plat::reg::kKeyRead, created.out()), 0);

    // A refused registry write: of the new key first, then of the value under the existing key.
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(MessageOf("[REGISTRY] (DWORD)HKCU\\New\\Name=1"), "Unable to create requested registry key.");
    plat::fault::FailNth(plat::fault::Op::RegWrite, 1, 5);
    EXPECT_EQ(MessageOf("[REGISTRY] (STRING)HKCU\\Binary\\Name=1"), "Unable to create requested registry entry.");
    plat::fault::Clear();
}

TEST(ExecuteRegSvr, OnlyDeclaredSelfRegisteringLibrariesAreRegistered) {
    pextest::TestMachine m;
    MachineForModules modulesSeeIt(m);
    const auto registered = [] {
        return ReadValue(plat::reg::kLocalMachine, "Software\\Vantric\\Test", "RegisteredBy", plat::reg::kRegSz);
    };
    // Exports DllRegisterServer but lacks "OLESelfRegister": never loaded, so never called.
    EXPECT_EQ(MessageOf("[REGSVR] " + AppFolder() + "PexNoSelfReg.dll"), "Registration Failed!");
    EXPECT_EQ(MessageOf("[REGSVR] " + AppFolder() + "PexNoVersion.dll"), "Registration Failed!");
    EXPECT_EQ(MessageOf("[REGSVR] C:\\App\\missing.dll"), "Registration Failed!");
    EXPECT_EQ(registered(), "");

    EXPECT_TRUE(CommandString("C:\\App").Execute("[REGSVR] \"" + AppFolder() + "PexSelfReg.dll\""));
    EXPECT_EQ(registered(), Sz("PexSelfReg"));
}

}  // namespace

// Version information: a real Windows DLL (tests/fixtures/versioned.dll) and our own stamped
// ELF modules and programs, read through the same parser.
#include "platform/version_info.h"

#include <gtest/gtest.h>

#include <string>

#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/pe_resources.h"
#include "tests/support/case_file.h"
#include "tests/support/environment.h"
#include "tests/support/test_machine.h"

namespace {

using plat::ver::VersionInfo;

std::string AppFolder() {
    std::string app = plat::files::ModuleFileName(nullptr);
    return app.substr(0, app.find_last_of('\\') + 1);
}

std::string Fixture() { return plat::paths::ToWindows(PEX_FIXTURE_DIR "/versioned.dll"); }

std::string StringOf(const VersionInfo& info, const std::string& subBlock) {
    std::string value;
    return info.QueryString(subBlock, &value) ? value : "<none>";
}

// Both translations of the fixture, names without regard to case, single-byte texts.
TEST(VersionInfo, WindowsDllFixture) {
    pextest::TestMachine m;
    VersionInfo info;
    ASSERT_TRUE(plat::ver::Read(Fixture(), &info));
    ASSERT_NE(info.Fixed(), nullptr);
    EXPECT_EQ(info.Fixed()->fileVersionMS, (3u << 16) | 10u);
    EXPECT_EQ(info.Fixed()->fileVersionLS, (40000u << 16) | 5u);
    ASSERT_EQ(info.Translations().size(), 2u);
    EXPECT_EQ(info.Translations()[1].language, 0x0407);
    EXPECT_EQ(info.Translations()[1].codePage, 0x04E4);
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/fixture_versions.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(StringOf(info, c[0]), pextest::Unescape(c[1]));
    }
}

// Our stamped programs and modules; a bare name is found by the library search, as
// GetFileVersionInfo finds it.
TEST(VersionInfo, OurStampedProgramAndModules) {
    pextest::TestMachine m;
    VersionInfo host, byName;
    ASSERT_TRUE(plat::ver::Read(AppFolder() + pextest::ProgramFile("pexupdate"), &host));
    ASSERT_NE(host.Fixed(), nullptr);
    EXPECT_EQ(host.Fixed()->fileVersionLS, (PEX_VERSION_BUILD << 16) | PEX_VERSION_REVISION);
    EXPECT_EQ(StringOf(host, "\\StringFileInfo\\040904E4\\FileVersion"), PEX_VERSION_TEXT);
    ASSERT_TRUE(plat::ver::Read("PexSelfReg.dll", &byName));
    EXPECT_EQ(StringOf(byName, "\\StringFileInfo\\040904E4\\OriginalFilename"), "PexSelfReg.dll");
}

TEST(VersionInfo, FilesWithoutVersionInformation) {
    pextest::TestMachine m;
    VersionInfo info;
    EXPECT_FALSE(plat::ver::Read(AppFolder() + "PexNoVersion.dll", &info));
    EXPECT_EQ(plat::LastError(), plat::ver::kErrorResourceTypeNotFound);
    m.WriteFile("C:\\notes.txt", "MZ is not enough");
    EXPECT_FALSE(plat::ver::Read("C:\\notes.txt", &info));
    EXPECT_EQ(plat::LastError(), plat::ver::kErrorResourceDataNotFound);
    EXPECT_FALSE(plat::ver::Read("C:\\missing.dll", &info));
    EXPECT_EQ(plat::LastError(), 2u);
#ifndef _WIN32
    // Devices have no version information, and are not read.
    EXPECT_FALSE(plat::ver::Read("Z:\\dev\\zero", &info));
    EXPECT_EQ(plat::LastError(), plat::ver::kErrorResourceDataNotFound);
#endif
}

std::uint32_t U32At(const std::string& b, std::size_t at) {
    std::uint32_t v = 0;
    for (int i = 3; i >= 0; --i) v = (v << 8) | static_cast<unsigned char>(b[at + static_cast<std::size_t>(i)]);
    return v;
}

// The resource lookup trusts nothing the headers say beyond what they hold.
TEST(VersionInfo, ResourceLookupFollowsOnlyHeadersThatHoldTogether) {
    pextest::TestMachine m;
    std::string file;
    ASSERT_TRUE(plat::files::ReadAll(Fixture(), &file));
    std::string data;
    EXPECT_EQ(plat::pe::FirstResourceOfType(file, 3, &data), plat::pe::Lookup::NotFound);  // no icons
    const std::size_t pe = U32At(file, 60), opt = pe + 24;
    const std::size_t optSize = U32At(file, pe + 20) & 0xFFFF;
    // A section table cut short.
    EXPECT_EQ(plat::pe::FirstResourceOfType(file.substr(0, opt + optSize + 20), plat::pe::kRtVersion, &data),
              plat::pe::Lookup::NotImage);
    // Two data directories only: the resource directory (the third) is not there.
    const std::size_t dirCount = opt + ((U32At(file, opt) & 0xFFFF) == 0x10B ? 92 : 108);
    std::string twoDirectories = file;
    twoDirectories[dirCount] = 2;
    EXPECT_EQ(plat::pe::FirstResourceOfType(twoDirectories, plat::pe::kRtVersion, &data),
              plat::pe::Lookup::NoResources);
}

// Found by fuzzing: a resource whose section lies partly beyond the end of the file threw
// std::out_of_range, or came back cut short. Cut anywhere, the module gives its whole block or
// none.
TEST(VersionInfo, ModulesCutShortGiveTheWholeBlockOrNone) {
    pextest::TestMachine m;
    std::string file;
    ASSERT_TRUE(plat::files::ReadAll(Fixture(), &file));
    std::string whole;
    ASSERT_EQ(plat::pe::FirstResourceOfType(file, plat::pe::kRtVersion, &whole), plat::pe::Lookup::Found);
    std::size_t found = 0;
    for (std::size_t n = 0; n < file.size(); ++n) {
        std::string block;
        const plat::pe::Lookup lookup = plat::pe::FirstResourceOfType(file.substr(0, n), plat::pe::kRtVersion, &block);
        if (lookup != plat::pe::Lookup::Found) continue;
        ++found;
        EXPECT_EQ(block, whole) << "cut at " << n;
    }
    EXPECT_GT(found, 0u);  // the zero padding after the block may go
    // A block cut short is refused or read in part, never beyond its bytes (the sanitizer build
    // checks that).
    VersionInfo info;
    for (std::size_t n = 0; n < whole.size(); ++n) info.Parse(whole.substr(0, n));
    EXPECT_FALSE(info.Parse(whole.substr(0, 5)));
}

}  // namespace

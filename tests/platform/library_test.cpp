// Libraries: the Windows search order for bare names, exports (with the undecorated fallback
// for MSVC-decorated names) and the failures Windows reports. The test modules are built
// beside this test program: PexSelfReg.dll, PexNoSelfReg.dll, PexNoVersion.dll. Calling a
// module's DllRegisterServer is tested through [REGSVR] (command_executors_test.cpp).
#include "platform/library.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"

namespace {

using plat::lib::Library;

std::string AppFolder() {
    std::string app = plat::files::ModuleFileName(nullptr);
    return app.substr(0, app.find_last_of('\\') + 1);
}

void CopyModule(const pextest::TestMachine& m, const std::string& module, const std::string& winPath) {
    m.WriteFile(winPath, "");
    std::filesystem::copy_file(plat::paths::ToHost(AppFolder() + module), plat::paths::ToHost(winPath),
                               std::filesystem::copy_options::overwrite_existing);
}

// Which test module a handle holds, by the name it reports.
std::string NameOf(const Library& lib) {
    auto name = reinterpret_cast<const char* (*)()>(plat::lib::FindExport(lib.get(), "PexModuleName"));
    return name ? name() : "";
}

TEST(Library, BareNamesFollowTheSearchOrder) {
    pextest::TestMachine m;
    // The application folder comes before system32, which comes before the current folder.
    CopyModule(m, "PexNoVersion.dll", "C:\\windows\\system32\\PexSelfReg.dll");
    CopyModule(m, "PexNoVersion.dll", "C:\\windows\\system32\\shared.dll");
    CopyModule(m, "PexNoSelfReg.dll", "C:\\cur\\shared.dll");
    CopyModule(m, "PexNoSelfReg.dll", "C:\\cur\\local.dll");
    ASSERT_TRUE(plat::paths::ChangeDirectory("C:\\cur"));

    Library app(plat::lib::Load("PexSelfReg.dll"));
    Library system(plat::lib::Load("SHARED"));  // ".dll" is added to a name without extension
    Library current(plat::lib::Load("local.dll"));
    EXPECT_EQ(NameOf(app), "PexSelfReg");
    EXPECT_EQ(NameOf(system), "PexNoVersion");
    EXPECT_EQ(NameOf(current), "PexNoSelfReg");

    // A path is loaded from that path only.
    Library byPath(plat::lib::Load("C:\\cur\\shared.dll"));
    EXPECT_EQ(NameOf(byPath), "PexNoSelfReg");
    // The same module again is the same handle.
    Library again(plat::lib::Load("C:\\CUR\\Shared.dll"));
    EXPECT_EQ(again.get(), byPath.get());
}

TEST(Library, ExportsTheUndecoratedFallbackAndLoadFailures) {
    pextest::TestMachine m;
    Library lib(plat::lib::Load("PexNoVersion.dll"));
    ASSERT_TRUE(lib);
    auto answer = reinterpret_cast<int (*)()>(plat::lib::FindExport(lib.get(), "?Answer@@YAHXZ"));
    ASSERT_NE(answer, nullptr);
    EXPECT_EQ(answer(), 42);
    EXPECT_EQ(plat::lib::FindExport(lib.get(), "?Missing@@YAHXZ"), nullptr);
    EXPECT_EQ(plat::LastError(), 127u);
    // Only the module's own exports count, not those of what it links against.
    EXPECT_EQ(plat::lib::FindExport(lib.get(), "malloc"), nullptr);

    EXPECT_EQ(plat::lib::Load(""), nullptr);
    EXPECT_EQ(plat::LastError(), 126u);
    m.WriteFile("C:\\text.dll", "not a module");
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/library_loads.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(plat::lib::Load(c[0]), nullptr);
        EXPECT_EQ(plat::LastError(), std::stoul(c[1]));
    }
    EXPECT_FALSE(plat::lib::Free(nullptr));
}

}  // namespace

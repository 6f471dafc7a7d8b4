// Where the dispatcher looks for Rivzip.dll, what it logs on the way, and unloading. The test
// program sits apart from the built modules, so the bare name "Rivzip.dll" is found only where a
// test puts a copy.
#include "platform/registry.h"
#include "tests/decompress/decompress_test_support.h"
#include "tests/support/test_registry.h"

namespace dectest {
namespace {

constexpr char kKey[] = "SOFTWARE\\Vantric\\ZENDOR32";
const std::string kFolder1 = "c:\\program files\\vantric\\orlandel\\";
const std::string kFolder2 = kFolder1 + "shared\\";
const std::string kInit = "CDecompressionObjects::Load, Initializing";
const std::string kReg = "CDecompressionObjects::GetRegistryPath";
const std::string kFound = "CDecompressionObjects::Load, decompress function found for LZW";
const std::string kPath1 = "CDecompressionObjects::GetDefaultPath1", kPath2 = "CDecompressionObjects::GetDefaultPath2",
                  kPath3 = "CDecompressionObjects::GetDefaultPath3";

using LibraryLocation = DecompressTest;

TEST_F(LibraryLocation, NothingToLoadIsLoggedAndTriedAgainAtTheNextLzwExpansion) {
    CDecompressionObjects dispatcher;
    const Lines attempt = {kInit, kReg, kReg + ", Unable to access registry, RegOpenKeyEx returns 2", kPath1, kPath2,
                           kPath3, "CDecompressionObjects::Load, Unable to load Rivzip.dll"};
    EXPECT_EQ(trace_.Lines(), attempt);
    trace_.Clear();
    EXPECT_FALSE(dispatcher.DecompressLZW("C:\\app.ex_", nullptr));
    Lines again = {"CDecompressionObjects::DecompressLZW, file is C:\\app.ex_"};
    again.insert(again.end(), attempt.begin(), attempt.end());
    again.push_back("CDecompressionObjects::DecompressLZW, no function pointer for this decompress type");
    again.push_back("CDecompressionObjects::DecompressLZW, returning 0");
    EXPECT_EQ(trace_.Lines(), again);
}

TEST_F(LibraryLocation, WithoutValueOrDefaultFoldersTheCurrentFolderServesBeforeTheSearch) {
    pextest::CreateRegKey(plat::reg::kLocalMachine, kKey);  // the key, but no "path"
    Place(kRivzipModule, "C:\\Rivzip.dll");                 // C:\ is the current folder
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), (Lines{kInit, kReg, kReg + ", Unable to access registry, RegQueryValueEx returns 2",
                                     kPath1, kPath2, kPath3, kFound}));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), ".\\Rivzip.dll") << "the fourth candidate, not the bare name";

    trace_.Clear();
    dispatcher.Unload();
    EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Unload", "CDecompressionObjects::Unload, nulling function pointer",
                                     "CDecompressionObjects::Unload, FreeLibrary succeeded"}));
    EXPECT_FALSE(CDecompressionObjects::IsLoaded());
}

TEST_F(LibraryLocation, TheRegistryValueNamesTheFolderWhenItIsText) {
    Place(kRivzipModule, "C:\\Tools\\Rivzip.dll");
    Place(kRivzipModule, kFolder2 + "Rivzip.dll");
    pextest::SetRegText(plat::reg::kLocalMachine, kKey, "path", "C:\\Tools");
    {
        CDecompressionObjects dispatcher;
        EXPECT_EQ(trace_.Lines(), (Lines{kInit, kReg, kFound}));
        EXPECT_EQ(CDecompressionObjects::LoadedFrom(), "C:\\Tools\\Rivzip.dll");
        dispatcher.Unload();
    }

    // The same text as REG_EXPAND_SZ is refused: the size query's own result, 0, is logged.
    pextest::SetRegValue(plat::reg::kLocalMachine, kKey, "path", plat::reg::kRegExpandSz, std::string("C:\\Tools", 9));
    trace_.Clear();
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), (Lines{kInit, kReg, kReg + ", Unable to access registry, RegQueryValueEx returns 0",
                                     kPath1, kPath2, kFound}));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), kFolder2 + "Rivzip.dll");
}

TEST_F(LibraryLocation, ALibraryWithoutTheEntryStaysLoadedAndEveryLzwExpansionFails) {
    Place(kModuleWithoutEntry, kFolder1 + "Rivzip.dll");
    machine_.WriteFile("C:\\app.ex_", "SZDD data");
    CDecompressionObjects dispatcher;
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::Load, no decompress function found for LZW"));
    trace_.Clear();
    EXPECT_FALSE(dispatcher.DecompressLZW("C:\\app.ex_", nullptr));
    EXPECT_FALSE(dispatcher.DecompressLZW("C:\\app.ex_", nullptr));
    const std::string one = "CDecompressionObjects::DecompressLZW, file is C:\\app.ex_\n"
                            "CDecompressionObjects::DecompressLZW, no function pointer for this decompress type\n"
                            "CDecompressionObjects::DecompressLZW, returning 0\n";
    EXPECT_EQ(trace_.Text(), one + one) << "loaded already: no second attempt";
    EXPECT_EQ(machine_.ReadFile("C:\\app.ex_"), "SZDD data");
}

}  // namespace
}  // namespace dectest

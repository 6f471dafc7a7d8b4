// Where the dispatcher looks for Rivzip.dll, what it logs on the way, and unloading. The test
// program sits apart from the built modules, so the bare name "Rivzip.dll" is found only where a
// test puts a copy.
#include "decompress/decompression_objects.h"

#include "platform/registry.h"
#include "tests/decompress/decompress_test_support.h"
#include "tests/support/test_registry.h"

namespace dectest {
namespace {

using Lines = std::vector<std::string>;

constexpr char kLocationKey[] = "SOFTWARE\\Vantric\\ZENDOR32";
constexpr char kFolder1[] = "c:\\program files\\vantric\\orlandel\\";
constexpr char kFolder2[] = "c:\\program files\\vantric\\orlandel\\shared\\";

const std::string kGetRegistryPath = "CDecompressionObjects::GetRegistryPath";
const std::string kQueryFailed = kGetRegistryPath + ", Unable to access registry, RegQueryValueEx returns ";
const Lines kDefaultPaths = {"CDecompressionObjects::GetDefaultPath1", "CDecompressionObjects::GetDefaultPath2",
                             "CDecompressionObjects::GetDefaultPath3"};

Lines Join(Lines a, const Lines& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

using LibraryLocation = DecompressTest;

TEST_F(LibraryLocation, NothingToLoadIsLoggedAndRetriedAtTheNextLzwExpansion) {
    machine_.WriteFile("C:\\dl\\app.ex_", "SZDD data");
    CDecompressionObjects dispatcher;
    const Lines attempt = Join({"CDecompressionObjects::Load, Initializing", kGetRegistryPath,
                                kGetRegistryPath + ", Unable to access registry, RegOpenKeyEx returns 2"},
                               Join(kDefaultPaths, {"CDecompressionObjects::Load, Unable to load Rivzip.dll"}));
    EXPECT_EQ(trace_.Lines(), attempt);
    EXPECT_FALSE(CDecompressionObjects::IsLoaded());

    trace_.Clear();
    EXPECT_FALSE(dispatcher.DecompressLZW("C:\\dl\\app.ex_", nullptr));
    EXPECT_EQ(trace_.Lines(),
              Join(Join({"CDecompressionObjects::DecompressLZW, file is C:\\dl\\app.ex_"}, attempt),
                   {"CDecompressionObjects::DecompressLZW, no function pointer for this decompress type",
                    "CDecompressionObjects::DecompressLZW, returning 0"}));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\app.ex_"), "SZDD data");
}

TEST_F(LibraryLocation, WithoutRegistryValueOrDefaultFoldersTheCurrentFolderServesBeforeTheSearch) {
    pextest::CreateRegKey(plat::reg::kLocalMachine, kLocationKey);  // the key, but no "path"
    Place(kRivzipModule, "C:\\Rivzip.dll");                         // C:\ is the current folder
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), Join(Join({"CDecompressionObjects::Load, Initializing", kGetRegistryPath,
                                         kQueryFailed + "2"},
                                        kDefaultPaths),
                                   {"CDecompressionObjects::Load, decompress function found for LZW"}));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), ".\\Rivzip.dll") << "the fourth candidate, not the bare name";

    // Loaded already: a second instance does not load again.
    trace_.Clear();
    CDecompressionObjects second;
    EXPECT_EQ(trace_.Lines(), Lines{});
}

TEST_F(LibraryLocation, TheRegistryValueNamesTheFolder) {
    Place(kRivzipModule, "C:\\Tools\\Rivzip.dll");
    for (const std::string folder : {"C:\\Tools", "C:\\Tools\\"}) {
        pextest::SetRegText(plat::reg::kLocalMachine, kLocationKey, "path", folder);
        trace_.Clear();
        CDecompressionObjects dispatcher;
        EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Load, Initializing", kGetRegistryPath,
                                         "CDecompressionObjects::Load, decompress function found for LZW"}));
        EXPECT_EQ(CDecompressionObjects::LoadedFrom(), "C:\\Tools\\Rivzip.dll");
        dispatcher.Unload();
    }
    // An empty folder text leaves the bare name, which the search finds in the current folder.
    Place(kRivzipModule, "C:\\Rivzip.dll");
    pextest::SetRegText(plat::reg::kLocalMachine, kLocationKey, "path", "");
    CDecompressionObjects dispatcher;
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), "Rivzip.dll");
}

TEST_F(LibraryLocation, AValueOfAnotherTypeIsRefusedAndTheDefaultFoldersAreTried) {
    Place(kRivzipModule, "C:\\Tools\\Rivzip.dll");
    Place(kRivzipModule, std::string(kFolder2) + "Rivzip.dll");
    const std::string text("C:\\Tools", 9);
    pextest::SetRegValue(plat::reg::kLocalMachine, kLocationKey, "path", plat::reg::kRegExpandSz, text);
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Load, Initializing", kGetRegistryPath, kQueryFailed + "0",
                                     "CDecompressionObjects::GetDefaultPath1", "CDecompressionObjects::GetDefaultPath2",
                                     "CDecompressionObjects::Load, decompress function found for LZW"}));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), std::string(kFolder2) + "Rivzip.dll");
}

TEST_F(LibraryLocation, ALibraryWithoutTheEntryStaysLoadedAndEveryLzwExpansionFails) {
    Place(kModuleWithoutEntry, std::string(kFolder1) + "Rivzip.dll");
    machine_.WriteFile("C:\\dl\\app.ex_", "SZDD data");
    CDecompressionObjects dispatcher;
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::Load, no decompress function found for LZW"));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), std::string(kFolder1) + "Rivzip.dll");

    trace_.Clear();
    for (int run = 0; run < 2; ++run)
        EXPECT_FALSE(dispatcher.Decompress(kCompressionLZW, "C:\\dl\\app.ex_", nullptr));
    const Lines one = {"CDecompressionObjects::Decompress, file is C:\\dl\\app.ex_",
                       "CDecompressionObjects::DecompressLZW, file is C:\\dl\\app.ex_",
                       "CDecompressionObjects::DecompressLZW, no function pointer for this decompress type",
                       "CDecompressionObjects::DecompressLZW, returning 0",
                       "CDecompressionObjects::Decompress, returning 0"};
    EXPECT_EQ(trace_.Lines(), Join(one, one));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\app.ex_"), "SZDD data");

    trace_.Clear();
    dispatcher.Unload();
    EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Unload", "CDecompressionObjects::Unload, FreeLibrary succeeded"}));
}

TEST_F(LibraryLocation, UnloadDropsEntryAndLibraryAndTheNextLzwExpansionLoadsAgain) {
    Place(kRivzipModule, std::string(kFolder1) + "Rivzip.dll");
    CDecompressionObjects dispatcher;
    trace_.Clear();
    dispatcher.Unload();
    EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Unload", "CDecompressionObjects::Unload, nulling function pointer",
                                     "CDecompressionObjects::Unload, FreeLibrary succeeded"}));
    EXPECT_FALSE(CDecompressionObjects::IsLoaded());
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), "");

    trace_.Clear();
    dispatcher.Unload();
    EXPECT_EQ(trace_.Lines(), Lines{"CDecompressionObjects::Unload"});

    dispatcher.DecompressLZW("C:\\missing.ex_", nullptr);
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::Load, decompress function found for LZW"));
    EXPECT_TRUE(CDecompressionObjects::IsLoaded());
}

}  // namespace
}  // namespace dectest

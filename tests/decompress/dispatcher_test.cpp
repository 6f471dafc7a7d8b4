// The decompression dispatcher: where it finds Rivzip.dll when no copy is anywhere or only the
// current folder holds one (the program sits apart from the built modules, so only the copies
// that a test places are found; the golden runs decompressor_without_entry,
// decompressor_expandable_path and decompress_types show the registry value and the default
// folders), what it logs on the way; a code that names no method, expansion records and damaged
// streams (the golden run decompress_stream_edges shows the edges of the zlib and gzip streams
// and the failures that leave a download as it arrived); and which of the library's progress
// reports reach the host's callback.
#include <gtest/gtest.h>
#include <zlib.h>

#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "decompress/decompression_objects.h"
#include "decompress/expansion_record.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/registry.h"
#include "rivzip/compress_performance.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

// The built Rivzip.dll (set by tests/decompress.cmake).
constexpr char kRivzipModule[] = PEX_RIVZIP_DLL;

class DecompressTest : public ::testing::Test {
protected:
    void TearDown() override { CDecompressionObjects().Unload(); }

    void Place(const char* hostModule, const std::string& winPath) {
        const std::filesystem::path target = plat::paths::ToHost(winPath);
        std::filesystem::create_directories(target.parent_path());
        std::filesystem::copy_file(hostModule, target, std::filesystem::copy_options::overwrite_existing);
    }

    pextest::TestMachine machine_;
    pextest::TraceCapture trace_;
};

constexpr char kKey[] = "SOFTWARE\\Vantric\\ZENDOR32";
// The trace lines of a search for Rivzip.dll, from cases/library_location.txt.
Lines Search(const std::string& scenario) {
    Lines lines;
    for (const pextest::Case& c : pextest::ReadCases("decompress/cases/library_location.txt"))
        if (c[0] == scenario) lines.push_back(c[1]);
    return lines;
}

using LibraryLocation = DecompressTest;

TEST_F(LibraryLocation, NothingToLoadIsLoggedAndTriedAgainAtTheNextLzwExpansion) {
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), Search("nothing"));
    trace_.Clear();
    EXPECT_FALSE(dispatcher.DecompressLZW("C:\\app.ex_", nullptr));
    EXPECT_EQ(trace_.Lines(), Search("again"));
}

TEST_F(LibraryLocation, WithoutValueOrDefaultFoldersTheCurrentFolderServesBeforeTheSearch) {
    pextest::CreateRegKey(plat::reg::kLocalMachine, kKey);  // the key, but no "path"
    Place(kRivzipModule, "C:\\Rivzip.dll");                 // C:\ is the current folder
    CDecompressionObjects dispatcher;
    EXPECT_EQ(trace_.Lines(), Search("current folder"));
    EXPECT_EQ(CDecompressionObjects::LoadedFrom(), ".\\Rivzip.dll") << "the fourth candidate, not the bare name";

    dispatcher.Unload();
    EXPECT_FALSE(CDecompressionObjects::IsLoaded());
}

constexpr char kPath[] = "C:\\dl\\app.exe";

std::string Sample(std::size_t size) {
    std::string data(size, '\0');
    std::uint32_t x = 12345;
    for (char& c : data) c = "abcdefgh"[((x = x * 1103515245u + 12345u) >> 16) & 7];
    return data;
}

std::string Deflate(const std::string& data, int windowBits) {
    z_stream z{};
    deflateInit2(&z, Z_BEST_SPEED, Z_DEFLATED, windowBits, 8, Z_DEFAULT_STRATEGY);
    std::string out(deflateBound(&z, data.size()), '\0');
    z.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(data.data()));
    z.avail_in = static_cast<uInt>(data.size());
    z.next_out = reinterpret_cast<Bytef*>(out.data());
    z.avail_out = static_cast<uInt>(out.size());
    deflate(&z, Z_FINISH);
    out.resize(z.total_out);
    deflateEnd(&z);
    return out;
}
constexpr int kZlib = 15, kGzip = 15 + 16;

class InPlaceExpansion : public DecompressTest {
protected:
    void SetUp() override {
        Place(kRivzipModule, "C:\\Rivzip.dll");
        dispatcher_.Load();
    }

    bool Expand(std::uint32_t code, const std::string& download) {
        machine_.WriteFile(kPath, download);
        trace_.Clear();
        return dispatcher_.Decompress(code, kPath, nullptr);
    }
    CDecompressionObjects dispatcher_;
};

// A code that names no method fails, so that its compressed bytes are never installed.
TEST_F(InPlaceExpansion, AnUnknownCodeIsNotExpanded) {
    EXPECT_FALSE(Expand(7, "payload"));
    EXPECT_EQ(trace_.Lines(), (Lines{"CDecompressionObjects::Decompress, file is C:\\dl\\app.exe",
                                     "CDecompressionObjects::Decompress, Unknown compression type 7",
                                     "CDecompressionObjects::Decompress, returning 0"}));
    EXPECT_EQ(machine_.ReadFile(kPath), "payload");
}

// An expanded download whose record names its bytes is not expanded again (the golden run
// decompress_types shows it, and decompress_stream_edges a record that names other bytes, which
// proves nothing); once its record is discarded, it is never taken for expanded: it is no stream.
TEST_F(InPlaceExpansion, WithoutItsRecordAnExpandedDownloadIsNoStream) {
    ASSERT_TRUE(Expand(kCompressionZLIB, Deflate(Sample(70000), kGzip)));
    EXPECT_TRUE(IsRecordedExpansion(kPath));
    EXPECT_TRUE(DiscardExpansionRecord(kPath));
    EXPECT_FALSE(plat::files::Exists(ExpansionRecordName(kPath)));
    EXPECT_FALSE(dispatcher_.Decompress(kCompressionZLIB, kPath, nullptr));
}

// The record names the bytes, not only their length: one byte changed anywhere, also the last
// one of a read of a single byte (65537 is a block and one), is not the recorded expansion.
TEST_F(InPlaceExpansion, ARecordNamesTheBytesNotOnlyTheirLength) {
    const std::string bytes = Sample(65537);
    for (std::size_t at : {std::size_t{0}, bytes.size() - 1}) {
        machine_.WriteFile(kPath, bytes);
        ASSERT_TRUE(RecordExpansion(kPath, kPath));
        EXPECT_TRUE(IsRecordedExpansion(kPath));
        std::string changed = bytes;
        changed[at] ^= 1;
        machine_.WriteFile(kPath, changed);
        EXPECT_FALSE(IsRecordedExpansion(kPath)) << at;
    }
}

// Damage anywhere in a stream either hits a field that nothing checks (the gzip header's time or
// system) and the data comes out whole, or the download stays as it arrived; nothing between.
TEST_F(InPlaceExpansion, DamagedStreamsNeverGiveWrongData) {
    const std::string original = Sample(5000);
    std::uint32_t x = 99;
    for (int round = 0; round < 120; ++round) {
        std::string damaged = Deflate(original, round % 2 ? kGzip : kZlib);
        for (int hits = 0; hits <= round % 3; ++hits, x = x * 1103515245u + 12345u)
            damaged[(x >> 8) % damaged.size()] ^= static_cast<char>(1 + (x >> 24) % 255);
        if (round % 5 == 0) damaged.resize((x >> 4) % damaged.size());
        const bool expanded = Expand(kCompressionZLIB, damaged);
        EXPECT_EQ(machine_.ReadFile(kPath), expanded ? original : damaged) << "round " << round;
    }
}

// A start, 6000 further reports and an end: the start reaches the callback twice (total, then
// done), the 2500th and 5000th further report once each, and the end once, with the total.
TEST(ExpandProgress, PassesTheStartTheEndAndEvery2500thReport) {
    static std::vector<std::pair<std::int32_t, std::int32_t>> seen;  // item total, item done at each call
    g_ProgressData = CProgressData();
    CDecompressionObjects::SetProgressCallback([](CProgressData* progress) {
        seen.emplace_back(progress->ItemTotal, progress->ItemDone);
        return false;  // a refusal that the library never hears of
    });
    const auto send = [](std::uint32_t processed, bool starting, bool ending) {
        SCompressPerformance record{};
        record.processed = processed;
        record.total = 6001 * 8;
        record.starting = starting;
        record.ending = ending;
        CDecompressionObjects::ExpandProgress(record);
    };
    send(0, true, false);
    for (std::uint32_t n = 1; n <= 6000; ++n) send(n * 8, false, false);
    send(12345, false, true);
    CDecompressionObjects::SetProgressCallback(nullptr);
    EXPECT_EQ(seen, (decltype(seen){{6001, 0}, {6001, 0}, {6001, 2500}, {6001, 5000}, {6001, 6001}}));
}

}  // namespace

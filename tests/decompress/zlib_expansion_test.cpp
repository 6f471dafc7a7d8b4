// ZLIB downloads: zlib and gzip streams expanded in place with zlib, progress, and corrupt or
// truncated data refused with the download put back.
#include <zlib.h>

#include "decompress/decompression_objects.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/decompress/decompress_test_support.h"

namespace dectest {
namespace {

using Lines = std::vector<std::string>;

constexpr int kZlibFormat = 15;
constexpr int kGzipFormat = 15 + 16;

std::string Deflate(const std::string& data, int windowBits) {
    z_stream z{};
    EXPECT_EQ(deflateInit2(&z, Z_BEST_SPEED, Z_DEFLATED, windowBits, 8, Z_DEFAULT_STRATEGY), Z_OK);
    std::string out(deflateBound(&z, data.size()), '\0');
    z.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(data.data()));
    z.avail_in = static_cast<uInt>(data.size());
    z.next_out = reinterpret_cast<Bytef*>(out.data());
    z.avail_out = static_cast<uInt>(out.size());
    EXPECT_EQ(deflate(&z, Z_FINISH), Z_STREAM_END);
    out.resize(z.total_out);
    deflateEnd(&z);
    return out;
}

// Bytes that compress only somewhat, so the compressed file spans many progress reports.
std::string Sample(std::size_t size) {
    std::string data(size, '\0');
    std::uint32_t x = 12345;
    for (char& c : data) {
        x = x * 1103515245u + 12345u;
        c = static_cast<char>("abcdefgh"[(x >> 16) & 7]);
    }
    return data;
}

struct Bar {
    static CProgressData last;
    static int calls;
    static bool Note(CProgressData* progress) {
        last = *progress;
        ++calls;
        return true;
    }
};
CProgressData Bar::last;
int Bar::calls = 0;

class ZlibExpansion : public DecompressTest {
protected:
    void TearDown() override {
        plat::fault::Clear();
        DecompressTest::TearDown();
    }

    // Writes the download and expands it through the dispatcher.
    bool Expand(const std::string& download, ProgressCallback callback = nullptr) {
        machine_.WriteFile(kPath, download);
        trace_.Clear();
        return dispatcher_.Decompress(kCompressionZLIB, kPath, callback);
    }

    static constexpr char kPath[] = "C:\\dl\\data.bin";
    CDecompressionObjects dispatcher_;
};

TEST_F(ZlibExpansion, ZlibAndGzipStreamsExpandInPlace) {
    const std::string original = Sample(300000);
    EXPECT_TRUE(Expand(Deflate(original, kZlibFormat)));
    EXPECT_EQ(machine_.ReadFile(kPath), original);
    Lines expected = {"CDecompressionObjects::Decompress, file is C:\\dl\\data.bin",
                      "CDecompressionObjects::DecompressZLib, file is C:\\dl\\data.bin"};
    for (const std::string& line : ExpansionLines("DecompressZLib", kPath, TempName(), "Decompress succeeded"))
        expected.push_back(line);
    expected.push_back("CDecompressionObjects::DecompressZLib, returning 1");
    expected.push_back("CDecompressionObjects::Decompress, returning 1");
    EXPECT_EQ(trace_.Lines(), expected);

    EXPECT_TRUE(Expand(Deflate(original, kGzipFormat)));
    EXPECT_EQ(machine_.ReadFile(kPath), original);
    // gzip members one after the other expand to their concatenation, as gunzip does.
    EXPECT_TRUE(Expand(Deflate("first, ", kGzipFormat) + Deflate("second", kGzipFormat)));
    EXPECT_EQ(machine_.ReadFile(kPath), "first, second");
    EXPECT_TRUE(Expand(Deflate("", kZlibFormat)));
    EXPECT_EQ(machine_.ReadFile(kPath), "");
}

TEST_F(ZlibExpansion, ProgressCountsTheCompressedBytes) {
    const std::string packed = Deflate(Sample(8 << 20), kZlibFormat);
    ASSERT_GT(packed.size(), 2500u * 1024u) << "enough reports for one to pass the thinning";
    Bar::calls = 0;
    EXPECT_TRUE(Expand(packed, &Bar::Note));
    EXPECT_EQ(Bar::calls, 4);  // the start twice, the 2500th report, the end
    EXPECT_EQ(Bar::last.ItemTotal, static_cast<std::int32_t>(packed.size() >> 3));
    EXPECT_EQ(Bar::last.ItemDone, Bar::last.ItemTotal);
}

TEST_F(ZlibExpansion, CorruptOrTruncatedDataFailsAndTheDownloadIsPutBack) {
    const std::string good = Deflate(Sample(100000), kZlibFormat);
    std::string flipped = good;
    flipped[good.size() / 2] ^= 0x55;
    std::string badCheck = good;
    badCheck[good.size() - 1] ^= 0x01;  // the Adler-32 value at the end
    const struct {
        const char* what;
        std::string download;
        const char* code;
    } cases[] = {
        {"not a stream", "SZDD\x88\xf0\x27\x33 this is no zlib data", "0xfffffffd."},
        {"empty", "", "0xfffffffb."},
        {"truncated", good.substr(0, good.size() / 2), "0xfffffffb."},
        {"corrupt", flipped, "0xfffffffd."},
        {"wrong check value", badCheck, "0xfffffffd."},
        {"trailing bytes", good + std::string(4, '\0'), "0xfffffffd."},
        {"truncated gzip", Deflate("abc", kGzipFormat).substr(0, 14), "0xfffffffb."},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        EXPECT_FALSE(Expand(c.download));
        EXPECT_EQ(machine_.ReadFile(kPath), c.download);
        EXPECT_TRUE(trace_.Contains(std::string("CDecompressionObjects::DecompressZLib, Decompress failed, return code is ") +
                                    c.code));
        EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressZLib, restored the compressed file '" +
                                    std::string(kPath) + "' from '" + TempName() + "'"));
        EXPECT_TRUE(plat::files::Find("C:\\windows\\temp\\*").empty());
    }
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressZLib, zlib reports: the data ends before the end of the stream"));
}

// Damage anywhere in a stream: either the damage is in a field that nothing checks (the gzip
// header's time or system) and the data comes out whole, or the expansion fails and the download
// is put back; never anything in between.
TEST_F(ZlibExpansion, DamagedStreamsNeverGiveWrongData) {
    const std::string original = Sample(5000);
    for (int format : {kZlibFormat, kGzipFormat}) {
        const std::string good = Deflate(original, format);
        std::uint32_t x = 99;
        for (int round = 0; round < 60; ++round) {
            std::string damaged = good;
            for (int hits = 0; hits < 1 + round % 3; ++hits) {
                x = x * 1103515245u + 12345u;
                damaged[(x >> 8) % damaged.size()] ^= static_cast<char>(1 + (x >> 24) % 255);
            }
            if (round % 5 == 0) damaged.resize((x >> 4) % damaged.size());
            SCOPED_TRACE(round);
            const bool expanded = Expand(damaged);
            EXPECT_EQ(machine_.ReadFile(kPath), expanded ? original : damaged);
        }
    }
}

// A full disk while the expanded data is written: the download is put back all the same.
bool FailTheNextWrite(CProgressData*) {
    static bool armed = false;  // only once: the ending report's call comes before the trace lines
    if (!armed) plat::fault::FailNth(plat::fault::Op::Write, 1, plat::kErrorDiskFull);
    armed = true;
    return true;
}

TEST_F(ZlibExpansion, AWriteFailureFailsAndTheDownloadIsPutBack) {
    const std::string packed = Deflate(Sample(100000), kGzipFormat);
    EXPECT_FALSE(Expand(packed, &FailTheNextWrite));
    EXPECT_EQ(machine_.ReadFile(kPath), packed);
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressZLib, Decompress failed, return code is 0xffffffff."));
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressZLib, zlib reports: file error 112 on '" +
                                std::string(kPath) + "'"));
}

}  // namespace
}  // namespace dectest

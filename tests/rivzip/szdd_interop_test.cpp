// The SZDD codec against independent tools: samples made by mscompress expand to their originals,
// and what we make expands with libmspack (skipped when the tests are built without it).
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "tests/rivzip/memory_streams.h"
#include "tests/support/test_machine.h"

#if PEX_HAVE_MSPACK
#include <mspack.h>
#endif

namespace rivziptest {
namespace {

namespace fs = std::filesystem;

Bytes ReadBytes(const std::string& hostPath) {
    const std::string text = pextest::ReadHostFile(hostPath);
    return Bytes(text.begin(), text.end());
}

TEST(SzddInterop, SamplesFromMscompressExpandToTheirOriginals) {
    int checked = 0;
    for (const auto& entry : fs::directory_iterator(RIVZIP_FIXTURES)) {
        std::string name = entry.path().string();
        if (name.back() != '_') continue;
        Bytes original = ReadBytes(name.substr(0, name.size() - 1)), expanded;
        EXPECT_EQ(Expand(ReadBytes(name), &expanded), static_cast<std::int32_t>(original.size())) << name;
        EXPECT_TRUE(expanded == original) << name;
        ++checked;
    }
    EXPECT_GE(checked, 5);
}

TEST(SzddInterop, LibmspackExpandsOurOutput) {
#if PEX_HAVE_MSPACK
    const pextest::TestMachine scratch;  // its drive is a host folder of this test's own
    std::string packed = scratch.DriveC() + "/ours.bi_", back = scratch.DriveC() + "/back.bin";
    msszdd_decompressor* szdd = mspack_create_szdd_decompressor(nullptr);
    ASSERT_NE(szdd, nullptr);
    // Short, around the window, runs, and a mix across a 64 KiB block.
    Bytes mixed = RandomBytes(20000, 21), text = TextLike(180000, 22);
    mixed.insert(mixed.end(), text.begin(), text.end());
    for (const Bytes& original : {TextLike(16, 23), TextLike(4100, 24), Bytes(70000, ' '), mixed}) {
        const Bytes ours = Compress(original);
        scratch.WriteFile("C:\\ours.bi_", std::string(ours.begin(), ours.end()));
        msszddd_header* header = szdd->open(szdd, packed.data());
        ASSERT_NE(header, nullptr);
        EXPECT_EQ(header->length, static_cast<off_t>(original.size()));
        EXPECT_EQ(header->missing_char, 'x');
        EXPECT_EQ(szdd->extract(szdd, header, back.data()), MSPACK_ERR_OK);
        szdd->close(szdd, header);
        EXPECT_TRUE(ReadBytes(back) == original) << original.size();
    }
    mspack_destroy_szdd_decompressor(szdd);
#else
    GTEST_SKIP() << "built without libmspack";
#endif
}

}  // namespace
}  // namespace rivziptest

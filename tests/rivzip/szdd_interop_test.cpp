// The SZDD codec against independent tools: samples made by mscompress expand to their originals,
// and what we make expands with libmspack (skipped when the tests are built without it).
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <string>

#include "tests/rivzip/memory_streams.h"

#if PEX_HAVE_MSPACK
#include <mspack.h>
#endif

namespace rivziptest {
namespace {

namespace fs = std::filesystem;

Bytes ReadHostFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    return Bytes(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

TEST(SzddInterop, SamplesFromMscompressExpandToTheirOriginals) {
    int checked = 0;
    for (const auto& entry : fs::directory_iterator(RIVZIP_FIXTURES)) {
        std::string name = entry.path().string();
        if (name.back() != '_') continue;
        Bytes original = ReadHostFile(name.substr(0, name.size() - 1)), expanded;
        EXPECT_EQ(Expand(ReadHostFile(name), &expanded), static_cast<std::int32_t>(original.size())) << name;
        EXPECT_TRUE(expanded == original) << name;
        ++checked;
    }
    EXPECT_GE(checked, 5);
}

#if PEX_HAVE_MSPACK
void WriteHostFile(const fs::path& path, const Bytes& bytes) {
    std::ofstream(path, std::ios::binary).write(reinterpret_cast<const char*>(bytes.data()), bytes.size());
}

// A host folder of this test's own, removed afterwards.
struct ScratchFolder {
    ScratchFolder() {
        fs::path candidate = fs::temp_directory_path() / ("rivzip-interop-" + std::to_string(std::random_device{}()));
        std::error_code ec;
        if (fs::create_directory(candidate, ec)) path = candidate;
    }
    ~ScratchFolder() {
        std::error_code ignored;
        if (!path.empty()) fs::remove_all(path, ignored);
    }
    fs::path path;
};
#endif

TEST(SzddInterop, LibmspackExpandsOurOutput) {
#if PEX_HAVE_MSPACK
    ScratchFolder folder;
    std::string packed = (folder.path / "ours.bi_").string(), back = (folder.path / "back.bin").string();
    msszdd_decompressor* szdd = mspack_create_szdd_decompressor(nullptr);
    ASSERT_NE(szdd, nullptr);
    // Short, around the window, runs, and a mix across a 64 KiB block.
    Bytes mixed = RandomBytes(20000, 21), text = TextLike(180000, 22);
    mixed.insert(mixed.end(), text.begin(), text.end());
    for (const Bytes& original : {TextLike(16, 23), TextLike(4100, 24), Bytes(70000, ' '), mixed}) {
        WriteHostFile(packed, Compress(original));
        msszddd_header* header = szdd->open(szdd, packed.data());
        ASSERT_NE(header, nullptr);
        EXPECT_EQ(header->length, static_cast<off_t>(original.size()));
        EXPECT_EQ(header->missing_char, 'x');
        EXPECT_EQ(szdd->extract(szdd, header, back.data()), MSPACK_ERR_OK);
        szdd->close(szdd, header);
        EXPECT_TRUE(ReadHostFile(back) == original) << original.size();
    }
    mspack_destroy_szdd_decompressor(szdd);
#else
    GTEST_SKIP() << "built without libmspack";
#endif
}

}  // namespace
}  // namespace rivziptest

// The SZDD codec against independent tools: samples made by mscompress expand to their originals,
// so does mscompress output made now, and what we make expands with libmspack. A tool that is
// not installed skips its test.
#include <gtest/gtest.h>

#include <cstdlib>
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

void WriteHostFile(const fs::path& path, const Bytes& bytes) {
    std::ofstream(path, std::ios::binary).write(reinterpret_cast<const char*>(bytes.data()), bytes.size());
}

// The tools are Linux programs: a Windows build of the tests has none of them.
bool HaveTool(const std::string& name) {
#ifdef _WIN32
    return name.empty();
#else
    return std::system(("command -v " + name + " >/dev/null").c_str()) == 0;
#endif
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

// Inputs for the tools. mscompress mangles files under 16 bytes, so none is smaller.
std::vector<Bytes> Samples() {
    Bytes mixed = RandomBytes(20000, 21), text = TextLike(180000, 22);
    mixed.insert(mixed.end(), text.begin(), text.end());
    return {TextLike(16, 23), TextLike(4100, 24), Bytes(70000, ' '), mixed};
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

TEST(SzddInterop, MscompressOutputExpands) {
    if (!HaveTool("mscompress")) GTEST_SKIP() << "mscompress is not installed";
    ScratchFolder folder;
    int index = 0;
    for (const Bytes& original : Samples()) {
        fs::path file = folder.path / ("sample" + std::to_string(index++) + ".bin");  // it never overwrites
        WriteHostFile(file, original);
        ASSERT_EQ(std::system(("mscompress '" + file.string() + "'").c_str()), 0);
        Bytes expanded;
        EXPECT_EQ(Expand(ReadHostFile(file.string() + "_"), &expanded), static_cast<std::int32_t>(original.size()));
        EXPECT_TRUE(expanded == original);
    }
}

TEST(SzddInterop, LibmspackExpandsOurOutput) {
#if PEX_HAVE_MSPACK
    ScratchFolder folder;
    std::string packed = (folder.path / "ours.bi_").string(), back = (folder.path / "back.bin").string();
    msszdd_decompressor* szdd = mspack_create_szdd_decompressor(nullptr);
    ASSERT_NE(szdd, nullptr);
    for (const Bytes& original : Samples()) {
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

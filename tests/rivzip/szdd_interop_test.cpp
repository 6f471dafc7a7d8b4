// The SZDD codec against independent tools: samples made by mscompress expand to their originals,
// mscompress output made now does too, and what we make expands with libmspack and msexpand.
// A tool that is not installed skips its test.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include "rivzip/rivzip_result.h"
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
    std::ofstream out(path, std::ios::binary);
    out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

bool HaveTool(const std::string& name) {
    return std::system(("command -v " + name + " >/dev/null 2>&1").c_str()) == 0;
}

// A host folder of its own for one test, removed afterwards.
class ScratchFolder {
public:
    ScratchFolder() {
        std::string pattern = (fs::temp_directory_path() / "rivzip-interop-XXXXXX").string();
        path_ = mkdtemp(pattern.data()) ? fs::path(pattern) : fs::path();
    }
    ~ScratchFolder() {
        std::error_code ignored;
        if (!path_.empty()) fs::remove_all(path_, ignored);
    }
    const fs::path& path() const { return path_; }

private:
    fs::path path_;
};

// Inputs for the tools. mscompress mangles files under 16 bytes, so none is smaller.
std::vector<Bytes> Samples() {
    Bytes mixed = RandomBytes(20000, 21);
    Bytes text = TextLike(180000, 21);
    mixed.insert(mixed.end(), text.begin(), text.end());
    return {TextLike(16, 22), TextLike(4100, 23), AllByteValues(70000), Runs(100000), mixed};
}

TEST(SzddInterop, SamplesFromMscompressExpandToTheirOriginals) {
    int checked = 0;
    for (const auto& entry : fs::directory_iterator(RIVZIP_FIXTURES)) {
        std::string name = entry.path().string();
        if (name.back() != '_') continue;
        Bytes original = ReadHostFile(name.substr(0, name.size() - 1));
        Bytes expanded;
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
        fs::path file = folder.path() / ("sample" + std::to_string(index++) + ".bin");
        WriteHostFile(file, original);
        ASSERT_EQ(std::system(("mscompress '" + file.string() + "'").c_str()), 0);
        Bytes expanded;
        EXPECT_EQ(Expand(ReadHostFile(file.string() + "_"), &expanded), static_cast<std::int32_t>(original.size()));
        EXPECT_TRUE(expanded == original) << file;
    }
}

TEST(SzddInterop, MsexpandExpandsOurOutput) {
    if (!HaveTool("msexpand")) GTEST_SKIP() << "msexpand is not installed";
    ScratchFolder folder;
    for (const Bytes& original : Samples()) {
        WriteHostFile(folder.path() / "ours.bi_", Compress(original));
        std::string command = "msexpand < '" + (folder.path() / "ours.bi_").string() + "' > '" +
                              (folder.path() / "back.bin").string() + "'";
        ASSERT_EQ(std::system(command.c_str()), 0);
        EXPECT_TRUE(ReadHostFile(folder.path() / "back.bin") == original);
    }
}

TEST(SzddInterop, LibmspackExpandsOurOutput) {
#if PEX_HAVE_MSPACK
    ScratchFolder folder;
    msszdd_decompressor* szdd = mspack_create_szdd_decompressor(nullptr);
    ASSERT_NE(szdd, nullptr);
    for (const Bytes& original : Samples()) {
        std::string packed = (folder.path() / "ours.bi_").string(), back = (folder.path() / "back.bin").string();
        WriteHostFile(packed, Compress(original));
        msszddd_header* header = szdd->open(szdd, const_cast<char*>(packed.c_str()));
        ASSERT_NE(header, nullptr);
        EXPECT_EQ(header->length, static_cast<off_t>(original.size()));
        EXPECT_EQ(header->missing_char, 'x');
        EXPECT_EQ(szdd->extract(szdd, header, const_cast<char*>(back.c_str())), MSPACK_ERR_OK);
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

// Expanding a 64 MiB download in place, as the apply pipeline does it (temporary copy, expansion
// into the download's own name, copy deleted): LZW through Rivzip.dll and ZLIB through zlib,
// beside a plain copy of the 64 MiB expanded file as the floor that no in-place expansion can beat.
// The rates are of expanded bytes, so the three rows compare directly.
#include <benchmark/benchmark.h>
#include <zlib.h>

#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>

#include "decompress/decompression_objects.h"
#include "platform/cfile.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "rivzip/file_operations.h"

namespace {

constexpr std::size_t kExpandedSize = 64u << 20;

// Data shaped like an installer: runs of text, of structured records and of noise.
std::string InstallerLike(std::size_t size) {
    std::string data;
    data.reserve(size);
    std::uint32_t x = 2003;
    while (data.size() < size) {
        x = x * 1103515245u + 12345u;
        switch ((x >> 16) % 3) {
            case 0: data += "Vantric component " + std::to_string(x % 977) + " installs into %ProgramFiles%\r\n"; break;
            case 1:
                for (int i = 0; i < 16; ++i) data += static_cast<char>(i * ((x >> 20) & 3));
                break;
            default:
                for (int i = 0; i < 24; ++i, x = x * 1103515245u + 12345u) data += static_cast<char>(x >> 24);
        }
    }
    data.resize(size);
    return data;
}

// A machine with the original, its SZDD and its zlib forms; removed at exit.
class BenchMachine {
public:
    BenchMachine() {
        std::string tmpl = (std::filesystem::temp_directory_path() / "pexbench-XXXXXX").string();
        if (!mkdtemp(tmpl.data())) throw std::runtime_error("cannot create a machine root");
        root_ = tmpl;
        plat::machine::SetRoot(root_);
        plat::machine::Ensure();
        const std::string original = InstallerLike(kExpandedSize);
        if (!plat::files::WriteAllDurably(kOriginal, original) || !plat::files::WriteAllDurably(kZlib, Deflated(original)))
            throw std::runtime_error("cannot write the samples");
        plat::CFile source, destination;
        if (!source.Open(kOriginal, plat::CFile::modeRead) ||
            !destination.Open(kSzdd, plat::CFile::modeCreate | plat::CFile::modeWrite) ||
            rivzip::CompressFile(source, destination, nullptr) < 0)
            throw std::runtime_error("cannot compress the sample");
    }
    ~BenchMachine() {
        std::error_code ec;
        std::filesystem::remove_all(root_, ec);
    }

    static constexpr const char* kOriginal = "C:\\original.bin";
    static constexpr const char* kSzdd = "C:\\original.bi_";
    static constexpr const char* kZlib = "C:\\original.z";

private:
    static std::string Deflated(const std::string& data) {
        uLongf size = compressBound(data.size());
        std::string out(size, '\0');
        if (compress2(reinterpret_cast<Bytef*>(out.data()), &size, reinterpret_cast<const Bytef*>(data.data()),
                      data.size(), Z_DEFAULT_COMPRESSION) != Z_OK)
            throw std::runtime_error("cannot deflate the sample");
        out.resize(size);
        return out;
    }

    std::string root_;
};

BenchMachine& Machine() {
    static BenchMachine machine;
    return machine;
}

constexpr const char* kDownload = "C:\\download.bin";

// Each round starts from the compressed download, put in place outside the timing.
void ExpandInPlace(benchmark::State& state, const char* packed, std::uint32_t code) {
    Machine();
    CDecompressionObjects dispatcher;  // Rivzip.dll is found beside this program
    for (auto _ : state) {
        state.PauseTiming();
        plat::files::Copy(packed, kDownload, false);
        state.ResumeTiming();
        if (!dispatcher.Decompress(code, kDownload, nullptr)) state.SkipWithError("expansion failed");
    }
    dispatcher.Unload();
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

void BM_ExpandLzwInPlace(benchmark::State& state) { ExpandInPlace(state, BenchMachine::kSzdd, kCompressionLZW); }
void BM_ExpandZlibInPlace(benchmark::State& state) { ExpandInPlace(state, BenchMachine::kZlib, kCompressionZLIB); }

void BM_CopyExpandedFile(benchmark::State& state) {
    Machine();
    for (auto _ : state)
        if (!plat::files::Copy(BenchMachine::kOriginal, kDownload, false)) state.SkipWithError("copy failed");
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

BENCHMARK(BM_ExpandLzwInPlace)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_ExpandZlibInPlace)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_CopyExpandedFile)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

BENCHMARK_MAIN();

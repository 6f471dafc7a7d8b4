// Expanding a 64 MiB file. First file to file, nothing flushed: SZDD through our codec and
// through libmspack's SZDD decompressor on the same file, zlib, and a plain copy of the expanded
// bytes as the floor. Then in place, as the apply pipeline does it (the download expanded into
// a staging file that is flushed and then takes the download's name): LZW through Rivzip.dll
// and ZLIB through zlib, beside a durable copy of the 64 MiB expanded file.
// The rates are of expanded bytes, so all rows compare directly.
#include <benchmark/benchmark.h>
#include <mspack.h>
#include <zlib.h>

#include <stdexcept>
#include <string>

#include "bench/bench_machine.h"
#include "decompress/decompression_objects.h"
#include "decompress/zlib_expand.h"
#include "platform/cfile.h"
#include "platform/files.h"
#include "platform/paths.h"
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

// The original, its SZDD and its zlib forms on the program's machine, made once.
class Samples {
public:
    Samples() {
        pexbench::Machine();
        const std::string original = InstallerLike(kExpandedSize);
        if (!plat::files::WriteAllDurably(kOriginal, original) || !plat::files::WriteAllDurably(kZlib, Deflated(original)))
            throw std::runtime_error("cannot write the samples");
        plat::CFile source, destination;
        if (!source.Open(kOriginal, plat::CFile::modeRead) ||
            !destination.Open(kSzdd, plat::CFile::modeCreate | plat::CFile::modeWrite) ||
            rivzip::CompressFile(source, destination, nullptr) < 0)
            throw std::runtime_error("cannot compress the sample");
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
};

Samples& TheSamples() {
    static Samples samples;
    return samples;
}

constexpr const char* kDownload = "C:\\download.bin";

// Each round starts from the compressed download, put in place outside the timing.
void ExpandInPlace(benchmark::State& state, const char* packed, std::uint32_t code) {
    TheSamples();
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

void BM_ExpandLzwInPlace(benchmark::State& state) { ExpandInPlace(state, Samples::kSzdd, kCompressionLZW); }
void BM_ExpandZlibInPlace(benchmark::State& state) { ExpandInPlace(state, Samples::kZlib, kCompressionZLIB); }

void BM_CopyExpandedFile(benchmark::State& state) {
    TheSamples();
    for (auto _ : state)
        if (!plat::files::Copy(Samples::kOriginal, kDownload, false)) state.SkipWithError("copy failed");
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

// File to file, with nothing flushed: the expansion itself, side by side with libmspack's SZDD
// decompressor on the same file and with a plain copy of the expanded bytes (the same reads and
// writes with nothing to compute). Each writes over the same output file.
constexpr const char* kOutput = "C:\\expanded.bin";

std::string HostOf(const char* winPath) { return plat::paths::ToHost(winPath); }

void BM_SzddExpandRivzip(benchmark::State& state) {
    TheSamples();
    for (auto _ : state) {
        plat::CFile source, destination;
        if (!source.Open(Samples::kSzdd, plat::CFile::modeRead) ||
            !destination.Open(kOutput, plat::CFile::modeCreate | plat::CFile::modeWrite) ||
            rivzip::ExpandFile(source, destination, nullptr) < 0)
            state.SkipWithError("expansion failed");
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

void BM_SzddExpandLibmspack(benchmark::State& state) {
    TheSamples();
    msszdd_decompressor* szdd = mspack_create_szdd_decompressor(nullptr);
    if (!szdd) {
        state.SkipWithError("libmspack has no SZDD decompressor");
        return;
    }
    const std::string in = HostOf(Samples::kSzdd), out = HostOf(kOutput);
    for (auto _ : state) {
        if (szdd->decompress(szdd, in.c_str(), out.c_str()) != MSPACK_ERR_OK) state.SkipWithError("libmspack failed");
    }
    mspack_destroy_szdd_decompressor(szdd);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

// The floor of any expansion: reading the expanded bytes and writing them, 64 KiB at a time.
void BM_CopyExpandedBytes(benchmark::State& state) {
    TheSamples();
    std::string buffer(1u << 16, '\0');
    for (auto _ : state) {
        plat::CFile source, destination;
        if (!source.Open(Samples::kOriginal, plat::CFile::modeRead) ||
            !destination.Open(kOutput, plat::CFile::modeCreate | plat::CFile::modeWrite)) {
            state.SkipWithError("cannot open the files");
            break;
        }
        for (std::uint32_t n; (n = source.Read(buffer.data(), static_cast<std::uint32_t>(buffer.size()))) > 0;)
            destination.Write(buffer.data(), n);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

void BM_ZlibExpandFile(benchmark::State& state) {
    TheSamples();
    for (auto _ : state) {
        plat::CFile source, destination;
        std::string why;
        if (!source.Open(Samples::kZlib, plat::CFile::modeRead) ||
            !destination.Open(kOutput, plat::CFile::modeCreate | plat::CFile::modeWrite) ||
            InflateFile(source, destination, nullptr, &why) < 0)
            state.SkipWithError("expansion failed");
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * kExpandedSize));
}

BENCHMARK(BM_SzddExpandRivzip)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_SzddExpandLibmspack)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_CopyExpandedBytes)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_ZlibExpandFile)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_ExpandLzwInPlace)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_ExpandZlibInPlace)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_CopyExpandedFile)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

BENCHMARK_MAIN();

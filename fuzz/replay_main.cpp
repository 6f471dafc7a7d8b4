// A fuzz target as a plain program, for builds without libFuzzer (gcc with ASan and UBSan): every
// file named on the command line, or found in a folder named there, is fed once to the target,
// in name order. Each file's name goes to standard error before it is fed, so a sanitizer report
// or an abort names the file that caused it. The inputs run on a thread with a 1 MiB stack, the
// main thread's stack on Windows, so that a seed which once overflowed it keeps being tried
// against the same bound. The target's own output (parsers print their messages) is dropped.
#include <pthread.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);
extern "C" __attribute__((weak)) int LLVMFuzzerInitialize(int* argc, char*** argv);

namespace fs = std::filesystem;

namespace {

constexpr std::size_t kStackBytes = 1024 * 1024;

struct Replay {
    std::vector<fs::path> files;
    int fed = 0;
};

std::vector<fs::path> InputFiles(int argc, char** argv) {
    std::vector<fs::path> files;
    for (int i = 1; i < argc; ++i) {
        const fs::path arg(argv[i]);
        if (!fs::is_directory(arg)) {
            files.push_back(arg);
            continue;
        }
        std::vector<fs::path> inFolder;
        for (const fs::directory_entry& entry : fs::recursive_directory_iterator(arg)) {
            if (entry.is_regular_file()) inFolder.push_back(entry.path());
        }
        std::sort(inFolder.begin(), inFolder.end());
        files.insert(files.end(), inFolder.begin(), inFolder.end());
    }
    return files;
}

void* FeedAll(void* arg) {
    Replay& replay = *static_cast<Replay*>(arg);
    for (const fs::path& file : replay.files) {
        std::fprintf(stderr, "replaying %s\n", file.c_str());
        std::ifstream in(file, std::ios::binary);
        if (!in) {
            std::fprintf(stderr, "cannot read %s\n", file.c_str());
            return nullptr;
        }
        const std::vector<std::uint8_t> bytes{std::istreambuf_iterator<char>(in),
                                              std::istreambuf_iterator<char>()};
        LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
        ++replay.fed;
    }
    return nullptr;
}

}  // namespace

int main(int argc, char** argv) {
    if (LLVMFuzzerInitialize) LLVMFuzzerInitialize(&argc, &argv);
    Replay replay;
    replay.files = InputFiles(argc, argv);
    if (replay.files.empty()) {
        std::fprintf(stderr, "usage: %s FILE-OR-FOLDER...  (no input found)\n", argv[0]);
        return 2;
    }
    if (!std::freopen("/dev/null", "w", stdout)) return 2;

    pthread_attr_t attr;
    pthread_attr_init(&attr);
    pthread_attr_setstacksize(&attr, kStackBytes);
    pthread_t thread;
    if (pthread_create(&thread, &attr, FeedAll, &replay) != 0) return 2;
    pthread_join(thread, nullptr);
    pthread_attr_destroy(&attr);

    const int total = static_cast<int>(replay.files.size());
    std::fprintf(stderr, "replayed %d of %d input(s)\n", replay.fed, total);
    return replay.fed == total ? 0 : 1;
}

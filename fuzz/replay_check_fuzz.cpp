// A target for checking the corpus replay itself (fuzz/replay_main.cpp): it aborts, as a failed
// check or a sanitizer does, on an input that starts with "abort", and accepts anything else.
#include <cstdint>
#include <cstdlib>
#include <cstring>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size >= 5 && std::memcmp(data, "abort", 5) == 0) std::abort();
    return 0;
}

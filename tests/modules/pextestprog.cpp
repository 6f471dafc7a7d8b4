// pextestprog: the program that process tests start.
//   pextestprog exit N            exits with N
//   pextestprog sleep MS          sleeps MS milliseconds, then exits with 0
//   pextestprog mark NAME         writes NAME in its working folder, exits with 0
//   pextestprog argv NAME ARGS... writes its arguments (argv[0] first), one a line, to NAME
//                                 in its working folder, and prints them
// Without a command it exits with 0; an unknown command exits with 99.
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <thread>

namespace {

int WriteArguments(int argc, char** argv) {
    FILE* out = std::fopen(argv[2], "wb");
    if (!out) return 98;
    for (int i = 0; i < argc; ++i) {
        std::fprintf(out, "%s\n", argv[i]);
        std::printf("argv[%d] = %s\n", i, argv[i]);
    }
    return std::fclose(out) == 0 ? 0 : 98;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2) return 0;
    const char* command = argv[1];
    if (argc >= 3 && std::strcmp(command, "exit") == 0) return std::atoi(argv[2]);
    if (argc >= 3 && std::strcmp(command, "sleep") == 0) {
        std::this_thread::sleep_for(std::chrono::milliseconds(std::atol(argv[2])));
        return 0;
    }
    if (argc >= 3 && std::strcmp(command, "mark") == 0) {
        FILE* out = std::fopen(argv[2], "wb");
        if (!out) return 98;
        std::fputs("marked\n", out);
        return std::fclose(out) == 0 ? 0 : 98;
    }
    if (argc >= 3 && std::strcmp(command, "argv") == 0) return WriteArguments(argc, argv);
    return 99;
}

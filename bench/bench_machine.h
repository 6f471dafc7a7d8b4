// A fresh emulated machine for one benchmark program: a temporary machine root that the
// platform is pointed at, removed when the program ends. Benchmarks that touch files share it,
// so that their paths mean the same thing in every program.
#pragma once
#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>

#include "platform/machine.h"

namespace pexbench {

class BenchMachine {
public:
    BenchMachine() {
        // PEX_BENCH_TMP lets ./run.sh bench keep the samples inside its build folder.
        const char* base = std::getenv("PEX_BENCH_TMP");
        const std::filesystem::path dir = base && *base ? std::filesystem::path(base)
                                                        : std::filesystem::temp_directory_path();
        std::filesystem::create_directories(dir);
        std::string tmpl = (dir / "pexbench-XXXXXX").string();
        if (!mkdtemp(tmpl.data())) throw std::runtime_error("cannot create a machine root");
        root_ = tmpl;
        plat::machine::SetRoot(root_);
        plat::machine::Ensure();
    }
    ~BenchMachine() {
        std::error_code ec;
        std::filesystem::remove_all(root_, ec);
    }
    BenchMachine(const BenchMachine&) = delete;
    BenchMachine& operator=(const BenchMachine&) = delete;

    const std::string& Root() const { return root_; }
    // The host folder of C:.
    std::string DriveC() const { return root_ + "/drive_c"; }

private:
    std::string root_;
};

// The program's one machine, made on first use.
inline BenchMachine& Machine() {
    static BenchMachine machine;
    return machine;
}

}  // namespace pexbench

// The product of the crash and error-injection tests (its machine is the folder product, whose
// README says what each file shows), and the states it may be found in. Beside its update
// files, files that only look like leftovers of an earlier run, which no run may touch: a row
// read as applied ("Skipped") whose download is an installed file, keep.dll, and a backup of
// app.exe that some other tool left.
#pragma once
#include <string>
#include <vector>

#include "tests/pipeline/pipeline_fixture.h"

namespace pextest {

// One update file: what its target held before the update and what it must hold after.
struct ProductFile {
    std::string name;
    bool hadTarget = true;
    std::string oldBytes, newBytes;
    std::string download;    // the downloaded copy's path
    std::string published;   // its bytes as published (compressed for the two expanded files)
    bool expanded = false;   // the download is decompressed in place before it is applied
    std::string Target() const { return std::string("C:\\App\\") + name; }
};

class CrashProduct : public PipelineTest {
protected:
    static constexpr const char* kRegistryMark = "Software\\Vantric\\Zendor32\\Installed";
    static constexpr const char* kRunMark = "C:\\App\\ran.txt";
    static constexpr const char* kInstalled = "C:\\App\\keep.dll";
    static constexpr const char* kForeignBackup = "C:\\App\\app.exe.$bak$";

    // Enough failing scenarios of a sweep to see the pattern without drowning the output.
    static constexpr int kFailingScenariosShown = 5;

    void SetUp() override;

    // The state that a run ended at any point must leave. A row's status agrees with the disk
    // as follows (a row counts as committed when it reads AppliedSuccessfully, or when the
    // content file was discarded after a complete success):
    //   - every target holds its previous bytes or its new bytes: never torn, never missing when
    //     it existed before, and a new file is either absent or whole;
    //   - a committed row's target holds the new bytes;
    //   - a row not committed whose target holds the new bytes in place of a previous version
    //     has a backup (target.$bak$, .$bak$x, ...) holding that previous version, so that the
    //     previous version is never lost before its group commits;
    //   - a backup only ever holds the previous version, so restoring it can never install
    //     anything else (a file new to the machine that an ended run had already put in place
    //     is found there by the next run, and so backed up: its backup holds the new bytes);
    //   - a row not committed keeps its download, compressed while the row says it needs
    //     decompressing and expanded once it says it does not;
    //   - the content file loads, with every row, or it is gone after a complete success (its
    //     entries may still name it: they go after it, the name last).
    void ExpectConsistent() const;

    // The state after a complete success: every target new, the content file and its entries
    // gone, no backup, download (but those named) or temporary file left, and the install
    // commands' marks made.
    void ExpectComplete(const std::vector<std::string>& downloadsLeft = {}) const;

    // The bytes at a Windows path, or "(missing)".
    static std::string Contents(const std::string& winPath);
    // The backups of a target that exist: target.$bak$, target.$bak$x, ... (bytes each).
    static std::vector<std::string> Backups(const std::string& target);
    // The names of the files that match a wildcard pattern, in order.
    static std::vector<std::string> Names(const std::string& pattern);
    // "old", "new", "published", "(missing)" or "other (N bytes)": what the bytes are to the file.
    static std::string Which(const ProductFile& file, const std::string& bytes);

    // The failed checks of the current test so far.
    static int Failures() { return ::testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count(); }

    std::vector<ProductFile> files_;

private:
    void ExpectFileConsistent(const ProductFile& file, const CContentTable* table, int row) const;
    void ExpectLookAlikesUntouched() const;
    bool ContentNamed() const;
};

}  // namespace pextest

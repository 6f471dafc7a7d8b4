// Rivzip.dll as its callers see it: loaded by name through the platform's library loader, its
// expand entry found under its decorated name and called on CFile objects of the test machine.
#include <gtest/gtest.h>

#include <string>

#include "platform/cfile.h"
#include "platform/library.h"
#include "rivzip/rivzip.h"
#include "tests/rivzip/memory_streams.h"
#include "tests/support/test_machine.h"

namespace rivziptest {
namespace {

using plat::CFile;

std::string Text(const Bytes& b) { return std::string(b.begin(), b.end()); }

class RivzipModule : public ::testing::Test {
protected:
    void SetUp() override {
        module_ = plat::lib::Library(plat::lib::Load(kRivzipModuleName));  // beside the test program
        ASSERT_TRUE(module_);
        expand_ = reinterpret_cast<RivzipFileFn>(plat::lib::FindExport(module_.get(), kRivzipExpandExport));
        ASSERT_TRUE(expand_);
    }

    // Runs an entry from one file of the machine into a new one, as the dispatcher does.
    std::int32_t Run(RivzipFileFn entry, const std::string& from, const std::string& to, unsigned fromMode = 0,
                     unsigned toMode = CFile::modeCreate | CFile::modeWrite, std::int64_t skip = 0) {
        CFile source, destination;
        EXPECT_TRUE(source.Open(from, fromMode) && destination.Open(to, toMode));
        source.Seek(skip, CFile::begin);
        return entry(source, destination, &Record, 0);
    }

    pextest::TestMachine machine_;
    plat::lib::Library module_;
    RivzipFileFn expand_ = nullptr;
};

// The source is read from where the caller left it, and the reports reach the caller's function.
// (The compress entry is the golden run pexupdate_compress's: its output's digest pins the bytes,
// the header's last character of the name included.)
TEST_F(RivzipModule, ExpandsFromWhereTheCallerLeftTheSource) {
    const std::string original = Text(TextLike(150000, 31)) + Text(RandomBytes(20000, 31));
    machine_.WriteFile("C:\\Pub\\prefixed.ex_", "junk!" + Text(Compress(Bytes(original.begin(), original.end()))));
    Reports().clear();
    EXPECT_EQ(Run(expand_, "C:\\Pub\\prefixed.ex_", "C:\\App.exe", 0, CFile::modeCreate | CFile::modeWrite, 5), 170000);
    EXPECT_EQ(machine_.ReadFile("C:\\App.exe"), original);
    ExpectWellFormedReports(170000, 170000, 170000);
}

// A file that is no SZDD gives its code through the module too (the dispatcher's tests show it).
TEST_F(RivzipModule, FileFailuresBecomeNegativeResultsNotExceptions) {
    // CFile throws when a file opened for writing is read, or one opened for reading is written.
    machine_.WriteFile("C:\\dl\\good.ex_", Text(Compress(TextLike(100000, 33))));
    machine_.WriteFile("C:\\dl\\out.exe", "");
    EXPECT_EQ(Run(expand_, "C:\\dl\\good.ex_", "C:\\dl\\x.exe", CFile::modeWrite | CFile::modeNoTruncate), kRivzipReadError);
    EXPECT_EQ(Run(expand_, "C:\\dl\\good.ex_", "C:\\dl\\out.exe", 0, CFile::modeRead), kRivzipWriteError);
}

}  // namespace
}  // namespace rivziptest

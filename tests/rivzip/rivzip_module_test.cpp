// Rivzip.dll as its callers see it: loaded by name through the platform's library loader, its
// entries found under their decorated names and called on CFile objects of the test machine.
#include <gtest/gtest.h>

#include <string>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/library.h"
#include "platform/version_info.h"
#include "rivzip/rivzip.h"
#include "tests/rivzip/memory_streams.h"
#include "tests/support/test_machine.h"

namespace rivziptest {
namespace {

std::string Text(const Bytes& b) { return std::string(b.begin(), b.end()); }

class RivzipModule : public ::testing::Test {
protected:
    void SetUp() override {
        module_ = plat::lib::Library(plat::lib::Load(kRivzipModuleName));
        ASSERT_TRUE(module_) << "Rivzip.dll beside the test program, error " << plat::LastError();
        expand_ = reinterpret_cast<RivzipFileFn>(plat::lib::FindExport(module_.get(), kRivzipExpandExport));
        compress_ = reinterpret_cast<RivzipFileFn>(plat::lib::FindExport(module_.get(), kRivzipCompressExport));
        ASSERT_NE(expand_, nullptr);
        ASSERT_NE(compress_, nullptr);
    }

    // Runs an entry from one file of the machine into another, as the dispatcher does.
    std::int32_t Run(RivzipFileFn entry, const std::string& from, const std::string& to,
                     RivzipProgressFn progress = nullptr) {
        plat::CFile source, destination;
        EXPECT_TRUE(source.Open(from, plat::CFile::modeRead | plat::CFile::shareDenyWrite));
        EXPECT_TRUE(destination.Open(to, plat::CFile::modeCreate | plat::CFile::modeWrite));
        return entry(source, destination, progress, 0);
    }

    pextest::TestMachine machine_;
    plat::lib::Library module_;
    RivzipFileFn expand_ = nullptr;
    RivzipFileFn compress_ = nullptr;
};

TEST_F(RivzipModule, CompressesAndExpandsFilesOfTheMachine) {
    std::string original = Text(TextLike(150000, 31)) + Text(RandomBytes(20000, 31));
    machine_.WriteFile("C:\\Pub\\Setup.exe", original);
    std::int32_t packed = Run(compress_, "C:\\Pub\\Setup.exe", "C:\\Pub\\Setup.ex_");
    std::string szdd = machine_.ReadFile("C:\\Pub\\Setup.ex_");
    ASSERT_EQ(packed, static_cast<std::int32_t>(szdd.size()));
    EXPECT_LT(szdd.size(), original.size());
    EXPECT_EQ(szdd[9], 'e') << "the last character of the name that the '_' replaces";

    EXPECT_EQ(Run(expand_, "C:\\Pub\\Setup.ex_", "C:\\Pub\\Setup2.exe"), static_cast<std::int32_t>(original.size()));
    EXPECT_EQ(machine_.ReadFile("C:\\Pub\\Setup2.exe"), original);
}

TEST_F(RivzipModule, ReadsTheSourceFromItsCurrentPosition) {
    std::string szdd = Text(Compress(TextLike(5000, 32)));
    machine_.WriteFile("C:\\dl\\a.tx_", "junk!" + szdd);
    plat::CFile source, destination;
    ASSERT_TRUE(source.Open("C:\\dl\\a.tx_", plat::CFile::modeRead));
    ASSERT_TRUE(destination.Open("C:\\dl\\a.txt", plat::CFile::modeCreate | plat::CFile::modeWrite));
    source.Seek(5, plat::CFile::begin);
    EXPECT_EQ(expand_(source, destination, nullptr, 0), 5000);
    destination.Close();
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\a.txt"), Text(TextLike(5000, 32)));
}

TEST_F(RivzipModule, FileFailuresBecomeNegativeResultsNotExceptions) {
    machine_.WriteFile("C:\\dl\\bad.ex_", "MZ this is no SZDD file at all");
    EXPECT_EQ(Run(expand_, "C:\\dl\\bad.ex_", "C:\\dl\\bad.exe"), kRivzipBadHeader);

    std::string szdd = Text(Compress(TextLike(100000, 33)));
    machine_.WriteFile("C:\\dl\\cut.ex_", szdd.substr(0, szdd.size() / 2));
    EXPECT_EQ(Run(expand_, "C:\\dl\\cut.ex_", "C:\\dl\\cut.exe"), kRivzipTruncated);

    // A source opened for writing only cannot be read; a destination opened for reading only
    // cannot be written: the CFile exceptions stay inside the module.
    machine_.WriteFile("C:\\dl\\good.ex_", szdd);
    machine_.WriteFile("C:\\dl\\out.exe", "");
    {
        plat::CFile writeOnly, destination;
        ASSERT_TRUE(writeOnly.Open("C:\\dl\\good.ex_", plat::CFile::modeWrite | plat::CFile::modeNoTruncate));
        ASSERT_TRUE(destination.Open("C:\\dl\\other.exe", plat::CFile::modeCreate | plat::CFile::modeWrite));
        EXPECT_EQ(expand_(writeOnly, destination, nullptr, 0), kRivzipReadError);
    }
    plat::CFile source, readOnly;
    ASSERT_TRUE(source.Open("C:\\dl\\good.ex_", plat::CFile::modeRead));
    ASSERT_TRUE(readOnly.Open("C:\\dl\\out.exe", plat::CFile::modeRead));
    EXPECT_EQ(expand_(source, readOnly, nullptr, 0), kRivzipWriteError);
}

TEST_F(RivzipModule, ReportsProgressThroughTheRecord) {
    machine_.WriteFile("C:\\dl\\big.bin", Text(TextLike(300000, 34)));
    ASSERT_GE(Run(compress_, "C:\\dl\\big.bin", "C:\\dl\\big.bi_"), 0);
    ProgressLog log;
    std::int32_t result = Run(expand_, "C:\\dl\\big.bi_", "C:\\dl\\again.bin", &ProgressLog::Record);
    ASSERT_EQ(result, 300000);
    ExpectWellFormedReports(log.reports, 300000, 300000, result);
}

TEST_F(RivzipModule, ExportsTheC_And_CxxFormsAndCarriesVersionInformation) {
    EXPECT_NE(plat::lib::FindExport(module_.get(), "LZSS_ExpandFile"), nullptr);
    EXPECT_NE(plat::lib::FindExport(module_.get(), "LZSS_CompressFile"), nullptr);
    EXPECT_EQ(plat::lib::FindExport(module_.get(), "ExpandSzdd"), nullptr) << "internals stay hidden";
    plat::ver::VersionInfo info;
    std::string path = plat::files::ModuleFileName(reinterpret_cast<const void*>(expand_));
    ASSERT_TRUE(plat::ver::Read(path, &info)) << path;
    std::string description;
    EXPECT_TRUE(info.QueryString("\\StringFileInfo\\040904E4\\FileDescription", &description));
    EXPECT_EQ(description, "Vantric Rivzip Decompression Library");
}

}  // namespace
}  // namespace rivziptest

// The dispatcher by compression code, and LZW expansion in place through Rivzip.dll: the steps
// it logs, and the download left as it was whenever the expansion fails.
#include "decompress/decompression_objects.h"

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "rivzip/file_operations.h"
#include "tests/decompress/decompress_test_support.h"

namespace dectest {
namespace {

using Lines = std::vector<std::string>;

// Text that compresses, long enough for several thousand progress reports.
std::string Sample(std::size_t size) {
    std::string text;
    for (std::size_t i = 0; text.size() < size; ++i) text += "line " + std::to_string(i * 7919 % 10007) + " of the sample\n";
    return text.substr(0, size);
}

std::vector<std::string> TempFolderFiles() {
    std::vector<std::string> names;
    for (const auto& entry : plat::files::Find("C:\\windows\\temp\\*")) names.push_back(entry.name);
    return names;
}

struct Bar {
    static CProgressData last;
    static int calls;
    static bool Note(CProgressData* progress) {
        last = *progress;
        ++calls;
        return true;
    }
};
CProgressData Bar::last;
int Bar::calls = 0;

class Dispatcher : public DecompressTest {
protected:
    void SetUp() override {
        Place(kRivzipModule, "C:\\Rivzip.dll");
        dispatcher_ = std::make_unique<CDecompressionObjects>();
        trace_.Clear();
    }
    void TearDown() override {
        plat::fault::Clear();
        DecompressTest::TearDown();
    }

    // SZDD data of the text, made by Rivzip's compressor.
    std::string Szdd(const std::string& text) {
        machine_.WriteFile("C:\\pub\\original", text);
        plat::CFile source, destination;
        EXPECT_TRUE(source.Open("C:\\pub\\original", plat::CFile::modeRead) &&
                    destination.Open("C:\\pub\\packed", plat::CFile::modeCreate | plat::CFile::modeWrite));
        EXPECT_GE(rivzip::CompressFile(source, destination, nullptr), 0);
        destination.Close();
        return machine_.ReadFile("C:\\pub\\packed");
    }

    std::unique_ptr<CDecompressionObjects> dispatcher_;
};

TEST_F(Dispatcher, CodesWithoutExpansionLeaveTheFileAlone) {
    machine_.WriteFile("C:\\dl\\a.exe", "payload");
    EXPECT_TRUE(dispatcher_->Decompress(kCompressionNone, "C:\\dl\\a.exe", nullptr));
    EXPECT_FALSE(dispatcher_->Decompress(kCompressionRTPatch, "C:\\dl\\a.exe", nullptr)) << "a patch is not the file";
    EXPECT_FALSE(dispatcher_->Decompress(7, "C:\\dl\\a.exe", nullptr));
    EXPECT_EQ(trace_.Lines(),
              (Lines{"CDecompressionObjects::Decompress, file is C:\\dl\\a.exe",
                     "CDecompressionObjects::DecompressNone, file is C:\\dl\\a.exe",
                     "CDecompressionObjects::Decompress, returning 1",
                     "CDecompressionObjects::Decompress, file is C:\\dl\\a.exe",
                     "CDecompressionObjects::DecompressRTPatch, file is C:\\dl\\a.exe THIS FUNCTION NOT IMPLEMENTED YET",
                     "CDecompressionObjects::Decompress, returning 0",
                     "CDecompressionObjects::Decompress, file is C:\\dl\\a.exe",
                     "CDecompressionObjects::Decompress, Unknown compression type 7",
                     "CDecompressionObjects::Decompress, returning 0"}));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\a.exe"), "payload");
}

TEST_F(Dispatcher, LzwExpandsInPlaceAndReportsProgress) {
    const std::string original = Sample(3 << 20);
    machine_.WriteFile("C:\\dl\\app.exe", Szdd(original));
    Bar::calls = 0;
    EXPECT_TRUE(dispatcher_->Decompress(kCompressionLZW, "C:\\dl\\app.exe", &Bar::Note));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\app.exe"), original);
    EXPECT_EQ(TempFolderFiles(), Lines{});

    Lines expected = {"CDecompressionObjects::Decompress, file is C:\\dl\\app.exe",
                      "CDecompressionObjects::DecompressLZW, file is C:\\dl\\app.exe"};
    for (const std::string& line : ExpansionLines("DecompressLZW", "C:\\dl\\app.exe", TempName(), "Decompress succeeded"))
        expected.push_back(line);
    expected.push_back("CDecompressionObjects::DecompressLZW, returning 1");
    expected.push_back("CDecompressionObjects::Decompress, returning 1");
    EXPECT_EQ(trace_.Lines(), expected);

    // 3 MiB in 1 KiB reports: the start twice, the 2500th report, the end.
    EXPECT_EQ(Bar::calls, 4);
    EXPECT_EQ(Bar::last.ItemTotal, static_cast<std::int32_t>(original.size() >> 3));
    EXPECT_EQ(Bar::last.ItemDone, Bar::last.ItemTotal);
}

TEST_F(Dispatcher, AFailedLzwExpansionPutsTheDownloadBack) {
    const std::string packed = Szdd(Sample(200000));
    const std::string cut = packed.substr(0, packed.size() / 2);
    machine_.WriteFile("C:\\dl\\app.exe", cut);
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\app.exe", nullptr));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\app.exe"), cut);
    EXPECT_EQ(TempFolderFiles(), Lines{});

    const std::string temp = TempName();
    Lines expected = {"CDecompressionObjects::DecompressLZW, file is C:\\dl\\app.exe"};
    for (const std::string& line : ExpansionLines("DecompressLZW", "C:\\dl\\app.exe", temp,
                                                  "Decompress failed, return code is 0xfffffffe."))
        expected.push_back(line);
    expected.push_back("CDecompressionObjects::DecompressLZW, restored the compressed file 'C:\\dl\\app.exe' from '" +
                       temp + "'");
    expected.push_back("CDecompressionObjects::DecompressLZW, returning 0");
    EXPECT_EQ(trace_.Lines(), expected);

    // Not SZDD at all: refused by the library, the file as it was.
    machine_.WriteFile("C:\\dl\\setup.exe", "MZ\x90 not compressed");
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\setup.exe", nullptr));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\setup.exe"), "MZ\x90 not compressed");
}

TEST_F(Dispatcher, WhenThePutBackFailsTheCompressedCopyIsKept) {
    const std::string packed = Szdd(Sample(50000)).substr(0, 100);
    machine_.WriteFile("C:\\dl\\app.exe", packed);
    plat::fault::FailNth(plat::fault::Op::Copy, 2, plat::kErrorAccessDenied);  // the copy back
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\app.exe", nullptr));
    const std::string temp = TempName();
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressLZW, Unable to restore the compressed file "
                                "'C:\\dl\\app.exe' from '" + temp + "', GetLastError returns 5, '" + temp + "' is kept"));
    EXPECT_EQ(machine_.ReadFile(temp), packed);
}

TEST_F(Dispatcher, FailuresBeforeWritingLeaveTheDownloadUntouched) {
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\missing.exe", nullptr));
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressLZW, Unable to copy file for decompress operation."));

    machine_.WriteFile("C:\\dl\\locked.exe", "SZDD?");
    plat::CFile holder;  // another program has the download open
    ASSERT_TRUE(holder.Open("C:\\dl\\locked.exe", plat::CFile::modeRead | plat::CFile::shareDenyWrite));
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\locked.exe", nullptr));
    EXPECT_TRUE(trace_.Contains("CDecompressionObjects::DecompressLZW, Unable to open target file for decompress operation."));
    EXPECT_EQ(machine_.ReadFile("C:\\dl\\locked.exe"), "SZDD?");
    EXPECT_EQ(TempFolderFiles(), Lines{});

    // No temporary folder: three attempts at a name, then the failure.
    std::filesystem::remove_all(machine_.DriveC() + "/windows/temp");
    trace_.Clear();
    EXPECT_FALSE(dispatcher_->DecompressLZW("C:\\dl\\locked.exe", nullptr));
    Lines expected = {"CDecompressionObjects::DecompressLZW, file is C:\\dl\\locked.exe"};
    for (int attempt = 0; attempt < 3; ++attempt) {
        expected.push_back("CManifestParser: sGetTempFileName");
        expected.push_back("CManifestParser: sGetTempFileName, return is ''");
    }
    expected.push_back("CDecompressionObjects::DecompressLZW, unable to get Temp file name");
    expected.push_back("CDecompressionObjects::DecompressLZW, returning 0");
    EXPECT_EQ(trace_.Lines(), expected);
}

}  // namespace
}  // namespace dectest

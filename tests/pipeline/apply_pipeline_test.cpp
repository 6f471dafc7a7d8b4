// End-to-end runs of one product that the golden runs (tests/runs) do not show: an empty table,
// one parser driven for several products, downloads that resist removal after a complete
// success, and a digest checked after expansion.
#include <gtest/gtest.h>

#include "manifest/manifest_parser.h"
#include "platform/cfile.h"
#include "platform/files.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/rivzip/memory_streams.h"

using pextest::ContentRow;

namespace {

std::int32_t g_steps = 0, g_total = 0;
bool CountSteps(CProgressData* p) {
    g_total = p->TotalSteps;
    g_steps = p->CurrentStep;
    return true;
}

class ApplyPipeline : public pextest::PipelineTest {
protected:
    std::int32_t Run(ProgressCallback callback = nullptr) {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(kProduct), callback);
    }
};

TEST_F(ApplyPipeline, AnEmptyMasterListIsACompleteSuccess) {
    Publish({});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Count("CManifestParser:  Application loop....."), 1);
    EXPECT_FALSE(plat::files::Exists(kContent));
}

// A host may drive several products with one parser and fill its special-file list once: each
// run starts with nothing of the one before, so a group that failed for the first product is
// neither applied again nor recorded in the second product's content file.
TEST_F(ApplyPipeline, OneParserRunsSeveralProductsEachOnItsOwn) {
    const std::string otherContent = "C:\\Pex\\Orlandel_content.txt";
    ContentRow failing = Row("failing.dll", "f", "G");
    failing["Command"] = "[RUN]nosuchprogram.exe";
    Publish({Row("Zendor32.exe", "host"), failing});
    CManifestParser parser;
    parser.AddToSpecialList("zendor32.exe");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 1);
    EXPECT_TRUE(parser.WasSpecialFileUpdateAttempted());
    const std::string firstContent = machine.ReadFile(kContent);

    Publish({Row("other.dll", "other")}, "", "Orlandel", otherContent);
    machine.WriteFile("C:\\App\\Zendor32.exe", "changed since");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Orlandel"), nullptr), 0);
    EXPECT_FALSE(parser.WasSpecialFileUpdateAttempted());
    EXPECT_EQ(parser.SpecialFiles().count("ZENDOR32.EXE"), 1u);
    EXPECT_EQ(Installed("other.dll"), "other");
    EXPECT_EQ(Installed("Zendor32.exe"), "changed since");
    EXPECT_EQ(Count("CManifestParser: considering applying file 'failing.dll'"), 1);
    EXPECT_FALSE(plat::files::Exists(otherContent));
    EXPECT_EQ(machine.ReadFile(kContent), firstContent);
}

// A read-only download is removed like any other; one that another program holds is left with a
// trace line, and neither keeps the content file of a complete success or the progress short.
TEST_F(ApplyPipeline, DownloadsThatResistRemovalDoNotKeepTheContentFile) {
    Publish({Row("ro.dll", "read-only download"), Row("held.dll", "held download")});
    ASSERT_TRUE(plat::files::SetAttributes("C:\\Pex\\cache\\ro.dll.new", plat::files::kAttrReadOnly));
    plat::CFile holder;
    ASSERT_TRUE(holder.Open("C:\\Pex\\cache\\held.dll.new", plat::CFile::modeRead | plat::CFile::shareDenyWrite));
    const std::int32_t before = g_ProgressData.CurrentStep;
    EXPECT_EQ(Run(&CountSteps), 0);
    EXPECT_EQ(g_steps - before, g_total);
    EXPECT_FALSE(plat::files::Exists("C:\\Pex\\cache\\ro.dll.new"));
    EXPECT_TRUE(trace.Contains("CManifestParser: ProcessUpdateInformation, unable to remove download "
                               "'C:\\Pex\\cache\\held.dll.new', left in place"));
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_FALSE(ContentEntriesPresent());
}

// The digest is of the file as installed: the download after its expansion.
TEST_F(ApplyPipeline, ACompressedDownloadIsCheckedAsExpanded) {
    const std::string payload = "szdd payload, szdd payload";
    ContentRow row = Row("packed.exe", rivziptest::CompressText(payload));
    row["Sha256"] = "5361e6a88b42ab58ec0066a63c955151e7bb12ad9aee3c4dbecdc0039676ed6c";
    row["NeedsDecompression"] = "1";  // SZDD, the download type of a row without capabilities
    Publish({row});
    EXPECT_EQ(Run(), 0);
    EXPECT_EQ(Installed("packed.exe"), payload);
    EXPECT_EQ(Count("CFile_: Sha256 of download (C:\\Pex\\cache\\packed.exe.new) matches"), 1);
}

}  // namespace

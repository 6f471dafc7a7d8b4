// A host may drive several products with one parser, which no golden run (tests/runs) shows:
// each run starts with nothing of the one before.
#include <gtest/gtest.h>

#include <algorithm>

#include "manifest/manifest_parser.h"
#include "platform/files.h"
#include "tests/pipeline/pipeline_fixture.h"

using pextest::ContentRow;

namespace {

using ApplyPipeline = pextest::PipelineTest;

// The host fills its special-file list once: a group that failed for the first product is
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

    Publish({Row("other.dll", "other")}, "Orlandel", otherContent);
    machine.WriteFile("C:\\App\\Zendor32.exe", "changed since");
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t("Orlandel"), nullptr), 0);
    EXPECT_FALSE(parser.WasSpecialFileUpdateAttempted());
    EXPECT_EQ(parser.SpecialFiles().count("ZENDOR32.EXE"), 1u);
    EXPECT_EQ(Installed("other.dll"), "other");
    EXPECT_EQ(Installed("Zendor32.exe"), "changed since");
    const std::vector<std::string> lines = trace.Lines();
    EXPECT_EQ(std::count(lines.begin(), lines.end(), "CManifestParser: considering applying file 'failing.dll'"), 1);
    EXPECT_FALSE(plat::files::Exists(otherContent));
    EXPECT_EQ(machine.ReadFile(kContent), firstContent);
}

}  // namespace

// `pexupdate status` after real product runs: a product whose group failed and rolled back, one
// whose file waits for the restart, one interrupted mid-way, one whose content file was kept
// aside and one that is up to date; in text and as JSON.
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "manifest/manifest_parser.h"
#include "platform/cfile.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/support/platform_guard.h"
#include "tools/status_report.h"

namespace status = pextool::status;
using nlohmann::json;
using pextest::ContentRow;

namespace {

bool Has(const std::string& text, const std::string& part) { return text.find(part) != std::string::npos; }

class StatusReport : public pextest::PipelineTest {
protected:
    static std::string ContentOf(const std::string& product) { return "C:\\Pex\\" + product + "_content.txt"; }

    void Publish(const std::string& product, const std::vector<ContentRow>& rows) {
        PipelineTest::Publish(rows, "", product, ContentOf(product));
    }
    std::int32_t RunProduct(const std::string& product) {
        CManifestParser parser;
        return parser.ProcessUpdateInformation(_bstr_t(product.c_str()), nullptr);
    }
    status::Report Gather(const std::string& only = "") {
        status::Report report;
        std::string error;
        EXPECT_TRUE(status::Gather(only, trace.Path(), &report, &error)) << error;
        return report;
    }
    // A product whose group fails on its second member's command and rolls back.
    void FailAGroup() {
        ContentRow two = Row("two.dll", "new two", "G");
        two["Command"] = "[RUN]nosuchprogram.exe";
        Publish("Orlandel", {Row("one.dll", "new one", "G"), two});
        ASSERT_EQ(RunProduct("Orlandel"), 1);
    }
    // A product whose run ended after replacing its target: the journal says so.
    void InterruptARun() {
        Publish("Halfway", {Row("half.dll", "new half")});
        machine.WriteFile(ContentOf("Halfway") + ".$jnl$",
                          "B|0|C:\\Pex\\cache\\half.dll.new|C:\\App\\half.dll|C:\\App\\half.dll.$bak$|20|0|0|0\n"
                          "R|0|C:\\Pex\\cache\\half.dll.new|C:\\App\\half.dll|C:\\App\\half.dll.$bak$\n");
    }
    // A product whose content file has a row with more cells than its header.
    void RejectAContentFile() {
        Publish("Broken", {Row("b.dll", "b")});
        machine.WriteFile(ContentOf("Broken"), "FileName,UpgradeStatus\r\nb.dll,Downloaded,extra\r\n");
        ASSERT_EQ(RunProduct("Broken"), 1);
    }
};

TEST_F(StatusReport, TellsWhatFailedWhatWasInterruptedAndWhatWasKeptAside) {
    FailAGroup();
    InterruptARun();
    RejectAContentFile();
    Publish("Fine", {Row("fine.dll", "fine")});
    ASSERT_EQ(RunProduct("Fine"), 0);

    const status::Report report = Gather();
    EXPECT_EQ(status::ExitCode(report), 1);
    const std::string text = status::RenderText(report);
    for (const char* part : {
             "Orlandel: needs attention\n  content file: C:\\Pex\\Orlandel_content.txt "
             "(1 ApplicationFailed, 1 Downloaded)\n"
             "  not applied: row 0 one.dll in C:\\App: Downloaded\n"
             "  not applied: row 1 two.dll in C:\\App: ApplicationFailed\n",
             "returned 1 failure\n",
             "    > CManifestParser: error running install commands for ( 'two.dll' )\n",
             "    > CManifestParser: Error detected applying a member of a file group, rolling back group.\n",
             "  interrupted run, waiting for recovery: C:\\Pex\\Halfway_content.txt.$jnl$\n"
             "    row 0 (BR) C:\\App\\half.dll\n  last run: none in the trace log\n",
             "Broken: needs attention\n  content file: none registered\n"
             "  kept aside: C:\\Pex\\Broken_content.txt.rejected (a content file that did not load)\n",
             "Fine: up to date\n  content file: none registered\n  last run: ",
             "), returned 0 failures\nHalfway: needs attention\n",
             "\nTrace log: C:\\pextest_trace.log\n",
         })
        EXPECT_TRUE(Has(text, part)) << part << "\nnot in:\n" << text;

    const json document = json::parse(status::RenderJson(report));
    EXPECT_EQ(document["version"], 1);
    EXPECT_EQ(document["needsAttention"], true);
    ASSERT_EQ(document["products"].size(), 4u);
    std::map<std::string, json> products;
    for (const json& product : document["products"]) products[product["name"]] = product;
    const json& failing = products["Orlandel"];
    EXPECT_EQ(failing["rows"], json({{"ApplicationFailed", 1}, {"Downloaded", 1}}));
    EXPECT_EQ(failing["notApplied"][1],
              json({{"row", 1}, {"fileName", "two.dll"}, {"folder", "C:\\App"}, {"status", "ApplicationFailed"}}));
    EXPECT_EQ(failing["lastRun"]["result"], 1);
    EXPECT_EQ(failing["interruptedRun"], nullptr);
    EXPECT_EQ(products["Halfway"]["interruptedRun"]["rows"],
              json::array({{{"row", 0}, {"steps", "BR"}, {"target", "C:\\App\\half.dll"}}}));
    EXPECT_EQ(products["Halfway"]["lastRun"], nullptr);
    EXPECT_EQ(products["Broken"]["contentFile"]["rejectedCopy"], "C:\\Pex\\Broken_content.txt.rejected");
    EXPECT_EQ(products["Broken"]["lastRun"]["result"], nullptr);  // a rejected file's run says no result
    EXPECT_EQ(products["Fine"]["needsAttention"], false);
    EXPECT_EQ(products["Fine"]["lastRun"]["explanation"], json::array());
}

TEST_F(StatusReport, AFileInUseIsShownWithItsRestartQueueEntry) {
    PEX_NOT_UNDER_WINE(pextest::kWineSetupApi);
    machine.WriteFile("C:\\App\\busy.exe", "running version");
    Publish("Busy", {Row("busy.exe", "next version")});
    {
        plat::CFile running;
        ASSERT_TRUE(running.Open("C:\\App\\busy.exe", plat::CFile::modeRead | plat::CFile::shareDenyWrite));
        ASSERT_EQ(RunProduct("Busy"), 1);
    }
    const status::Report report = Gather("busy");  // names compare without regard to case
    ASSERT_EQ(report.products.size(), 1u);
    const status::ProductStatus& busy = report.products[0];
    ASSERT_EQ(busy.queued.size(), 1u);
    EXPECT_EQ(busy.queued[0].to, "C:\\App\\busy.exe");
    EXPECT_TRUE(Has(status::RenderText(report), " -> C:\\App\\busy.exe\n"));
    const json document = json::parse(status::RenderJson(report));
    EXPECT_EQ(document["products"][0]["restartQueue"][0]["to"], "C:\\App\\busy.exe");
}

// The product's last run is the newest: the log before its .bak, the last run in the file.
TEST_F(StatusReport, TheLastRunIsTheNewestOneInTheLogOrItsBackup) {
    FailAGroup();
    machine.WriteFile("C:\\pextest_trace.bak", trace.Bytes());
    trace.Clear();
    EXPECT_EQ(Gather().products[0].lastRun.logFile, "C:\\pextest_trace.bak");
    machine.WriteFile(ContentOf("Orlandel"), "FileName,UpgradeStatus\r\n");
    ASSERT_EQ(RunProduct("Orlandel"), 0);
    status::Report report = Gather();
    EXPECT_EQ(report.products[0].lastRun.logFile, "C:\\pextest_trace.log");
    EXPECT_EQ(report.products[0].lastRun.result, 0);
    const std::string& when = report.products[0].lastRun.when;  // "YYYY/MM/DD - HH:MM:SS.mmm"
    EXPECT_TRUE(when.size() == 25 && when[4] == '/' && when.compare(10, 3, " - ") == 0 && when[21] == '.') << when;
    EXPECT_EQ(status::ExitCode(report), 0);
}

}  // namespace

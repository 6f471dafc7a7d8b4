// CManifestParser: the walk over the rows that decides which files take part in this run.
#include <cstdlib>

#include "diag/trace_log.h"
#include "entry/run_guard.h"
#include "manifest/manifest_parser.h"
#include "model/upgrade_status.h"

namespace {

bool NonZero(const std::string& cell) { return std::atol(cell.c_str()) != 0; }

}  // namespace

std::int32_t CManifestParser::ProcessUpdateInformation(_bstr_t project, ProgressCallback callback) {
    const ProductRun run;  // one run at a time in the process, one product run on the machine
    if (!run.Entered()) return ProductRun::kRefusedResult;
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation");
    if (callback) {
        g_ProgressData.SetStatusText("Analyzing data...");
        callback(&g_ProgressData);
    }
    std::int32_t result = 0;
    bool present = false;
    const std::string name = std::string(project);
    ResetRunState();
    const bool loaded = LoadManifest(name, &present);
    if (present) result = static_cast<std::int32_t>(RecoverEarlierRun(loaded ? &table_ : nullptr));
    if (!loaded) {
        result += RejectContentFile();
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, Unable to load Content file");
    } else if (!present) {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, No content file exists, nothing to do");
    } else {
        TRACE(g_TraceLog, "CManifestParser: Content file loaded, contents are:\r\n%s", table_.ToText().c_str());
        TRACE(g_TraceLog, "%s", "");
        TRACE(g_TraceLog, "%s", "");
        workSteps_ = 0;
        ResetCursor();
        TRACE(g_TraceLog, "CManifestParser: PUI, selected file is '%s'", contentFileTarget_.c_str());
        for (std::int32_t row = 0; NextRow(); ++row) AnalyzeRow(row, callback);
        if (callback) {
            g_ProgressData.SetTotalSteps(static_cast<std::int32_t>(workSteps_ + 1));
            callback(&g_ProgressData);
        }
        iProcessUpdateInformation(result, callback);
    }
    if (callback) {
        g_ProgressData.SetStatusText("Finished.");
        callback(&g_ProgressData);
    }
    return result;
}

void CManifestParser::AnalyzeRow(std::int32_t rowNumber, ProgressCallback callback) {
    TRACE(g_TraceLog, "%s", "");
    TRACE(g_TraceLog,
          "CManifestParser: PUI, Analyzing row %d---------------------------------------------------------------------",
          rowNumber);
    TRACE(g_TraceLog, "%s", "");
    const std::string fileName = GetField("FileName");
    if (callback) {
        g_ProgressData.SetStatusText("Analyzing " + fileName);
        callback(&g_ProgressData);
    }
    const bool forced = NonZero(GetField("Force Download"));
    const bool snoozable = NonZero(GetField("Snoozable"));
    if (mandatoryOnly_ && (!forced || snoozable)) {
        TRACE(g_TraceLog,
              "CManifestParser:  File %s is NOT part of group - User must have selected mandatory only "
              "updates, and this is not part of that grouping",
              fileName.c_str());
        return;
    }
    const std::string status = GetField("UpgradeStatus");
    if (status == UpgradeStatus[kAppliedSuccessfully]) {
        TRACE(g_TraceLog, "CManifestParser:  File '%s' has already been applied, skipping", fileName.c_str());
        return;
    }
    if (journal_.IsPending(static_cast<std::uint32_t>(rowNumber))) {
        TRACE(g_TraceLog, "CManifestParser:  File '%s' waits for the recovery of an earlier run, not applied in this run",
              fileName.c_str());
        return;
    }
    TRACE(g_TraceLog, "CManifestParser:  File '%s' is part of group", fileName.c_str());
    const std::string homeDir = GetField("HomeDir");
    const std::uint32_t downloadType = DetermineDownloadtype(GetField("InterestedParties"));
    const std::string cacheFile = GetField("DownLoadCacheFile");
    const std::string group = GetField("FileGroup");
    const std::string dependancies = GetField("DependancyOrder");
    const bool needsDecompression = NonZero(GetField("NeedsDecompression"));
    const std::string command = GetField("Command");
    const std::string updateDate = GetField("UpdateDate");
    if (status != UpgradeStatus[kDownloaded] && status != UpgradeStatus[kApplicationFailed]) {
        TRACE(g_TraceLog, "CManifestParser:  UpgradeStatus is '%s'", status.c_str());
        TRACE(g_TraceLog, "CManifestParser:  File %s is NOT part of group - file is not downloaded", fileName.c_str());
        return;
    }
    TRACE(g_TraceLog, "CManifestParser:  UpgradeStatus is downloaded or application failed");
    CFile_ file(static_cast<std::uint32_t>(rowNumber), true, false, homeDir, fileName, cacheFile, command,
                updateDate, needsDecompression, downloadType);
    file.SetJournal(&journal_);
    file.SetExpectedSha256(GetField("Sha256"));
    TestSpecialFile(fileName);
    masterList_.AddFile(group, file, dependancies);
    workSteps_ += needsDecompression ? 2 : 1;
}

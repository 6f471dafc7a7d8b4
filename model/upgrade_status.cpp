#include "model/upgrade_status.h"

#include "manifest/content_table.h"

const char* const UpgradeStatus[kUpgradeStatusCount] = {
    "NeedsDownloaded",
    "Downloaded",
    "InstallCommandNotUnderstood",
    "FailedNotMangled",
    "FailedMangled",
    "AppliedSuccessfully",
    "ApplicationFailed",
    "ExceededDownloadLimit",
    "DownloadAccessDenied",
};

const char kStatusSkipped[] = "Skipped";
const char kStatusMissingDependancySkipped[] = "MissingDependancySkipped";

const char* UpgradeStatusText(int code) {
    if (code < 0 || code >= kUpgradeStatusCount) return nullptr;
    return UpgradeStatus[code];
}

int UpgradeStatusCodeOf(const std::string& text) {
    for (int code = 0; code < kUpgradeStatusCount; ++code) {
        if (text == UpgradeStatus[code]) return code;
    }
    return -1;
}

void NormalizeUpgradeStatus(CContentTable& table) {
    const int column = table.ColumnIndex("UpgradeStatus");
    if (column < 0) return;
    const auto c = static_cast<std::uint32_t>(column);
    for (std::uint32_t row = 0; row < table.RowCount(); ++row) {
        // Both checks look at the text as read, so one replacement never feeds the other.
        const std::string status = table.Cell(row, c);
        if (status == kStatusSkipped) table.SetCell(row, c, UpgradeStatus[kAppliedSuccessfully]);
        if (status == kStatusMissingDependancySkipped) {
            table.SetCell(row, c, UpgradeStatus[kApplicationFailed]);
        }
    }
}

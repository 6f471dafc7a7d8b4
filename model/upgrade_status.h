// The upgrade status of a content-file row: the texts of the "UpgradeStatus" column. A status
// is stored only as its text; its position in UpgradeStatus is the code used in the program.
// Texts are part of the content file format and are compared exactly (case-sensitive, no
// trimming).
#pragma once
#include <string>

class CContentTable;

// The status codes: positions in UpgradeStatus.
enum UpgradeStatusCode : int {
    kNeedsDownloaded = 0,
    kDownloaded = 1,
    kInstallCommandNotUnderstood = 2,
    kFailedNotMangled = 3,
    kFailedMangled = 4,
    kAppliedSuccessfully = 5,
    kApplicationFailed = 6,
    kExceededDownloadLimit = 7,
    kDownloadAccessDenied = 8,
};

constexpr int kUpgradeStatusCount = 9;

// The fixed table of status texts, indexed by code.
extern const char* const UpgradeStatus[kUpgradeStatusCount];

// Transient texts that another writer of the content file may leave in the column; they are
// replaced on load (NormalizeUpgradeStatus) and never written by this library.
extern const char kStatusSkipped[];                   // becomes "AppliedSuccessfully"
extern const char kStatusMissingDependancySkipped[];  // becomes "ApplicationFailed"

// The text of a code; nullptr for a code outside 0 to 8.
const char* UpgradeStatusText(int code);

// The code of the entry equal to text (exact comparison); -1 when no entry is equal.
int UpgradeStatusCodeOf(const std::string& text);

// The normalisation pass after a load: in every row, an "UpgradeStatus" cell (column found
// without regard to case) of exactly "Skipped" becomes "AppliedSuccessfully" and one of
// exactly "MissingDependancySkipped" becomes "ApplicationFailed". Any other text, and a
// table without that column or without columns, is left as it is. Changes only the table.
void NormalizeUpgradeStatus(CContentTable& table);

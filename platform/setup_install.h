// Installing a file whose target may be in use (SetupInstallFileExA), and the queue of renames
// that Windows carries out at the next restart (PendingFileRenameOperations), which
// `pexupdate boot` carries out on the emulated machine.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

namespace plat::setup {

// Copy styles (SP_COPY_*).
constexpr std::uint32_t kCopySourceAbsolute = 0x40;
constexpr std::uint32_t kCopyInUseNeedsReboot = 0x100;

// SetupInstallFileExA without INF, context, source root or callback: copies source over
// destination at once when it can (inUse false). When the destination is in use (32) and the
// style has kCopyInUseNeedsReboot, the source is staged beside it under a unique temporary
// name and the pair is queued for the next restart (inUse true); both count as success.
// Otherwise false with the last error of the failed step (2 missing source, 5 read-only
// target, ...); a staged file whose queueing failed is removed again.
bool InstallFile(const std::string& source, const std::string& destination,
                 std::uint32_t copyStyle, bool* inUse);

// One queued operation, paths as Windows paths (without the "\??\" prefix of the stored form).
struct PendingRename {
    std::string from;
    std::string to;        // empty: delete from at restart
    bool replace = false;  // replace an existing target (MOVEFILE_REPLACE_EXISTING)
};

// Where the queue lives, below HKEY_LOCAL_MACHINE.
constexpr const char* kSessionManagerKey = "SYSTEM\\CurrentControlSet\\Control\\Session Manager";
constexpr const char* kPendingRenamesValue = "PendingFileRenameOperations";

// The stored form (REG_MULTI_SZ, as MoveFileEx with MOVEFILE_DELAY_UNTIL_REBOOT writes it):
// for each operation "\??\<from>" NUL, then "!\??\<to>" NUL ("!" only with replace; an empty
// string for a delete), and one more NUL at the end.
std::string EncodePendingRenames(const std::vector<PendingRename>& queue);
// Reads the stored form back; stops at the first empty source (the end) or at the data's end.
std::vector<PendingRename> DecodePendingRenames(const std::string& data);

// The queue now stored (empty when there is no value). False and the registry error when the
// value cannot be read (a missing value or key is an empty queue).
bool ReadPendingRenames(std::vector<PendingRename>* queue);
// Appends one operation to the stored queue. Returns the registry error code (0 on success).
long QueuePendingRename(const PendingRename& op);
// Stores the queue; an empty queue deletes the value, as Windows leaves none after a restart.
long WritePendingRenames(const std::vector<PendingRename>& queue);

// What the restart did with one queued operation: 0, or the error that kept it from happening.
struct RenameOutcome {
    PendingRename op;
    std::uint32_t error = 0;
};
// Carries the queue out in order, as Windows does at restart: renames (or deletes), and
// stores again only the operations that failed, so a staged file is never lost. Nothing is
// deleted unless the queue asked for it. False and the last error when the queue cannot be
// read or stored again; outcomes then holds what was done.
bool CarryOutPendingRenames(std::vector<RenameOutcome>* outcomes);

}  // namespace plat::setup

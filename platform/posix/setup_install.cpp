// SetupInstallFileExA on the emulated machine: an ordinary copy when the target is free, else
// a staged copy beside the target and a queued rename, as the setup API does on Windows.
#include "platform/setup_install.h"

#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace plat::setup {

namespace {

std::string FolderOf(const std::string& winPath) {
    std::string full = paths::FullPath(winPath);
    return full.substr(0, full.find_last_of('\\') + 1);
}

// The staged copy beside the target, queued to replace it; false with the last error set.
bool StageAndQueue(const std::string& source, const std::string& destination) {
    // The setup API names its staged files SETxxxx.tmp in the target's folder.
    std::string staged = files::TempFileName(FolderOf(destination), "SET");
    if (staged.empty()) return false;
    if (!files::Copy(source, staged, false)) {
        std::uint32_t err = LastError();
        files::Remove(staged);
        SetLastErrorCode(err);
        return false;
    }
    long rc = QueuePendingRename({paths::FullPath(staged), paths::FullPath(destination), true});
    if (rc != 0) {
        files::Remove(staged);
        SetLastErrorCode(static_cast<std::uint32_t>(rc));
        return false;
    }
    return true;
}

}  // namespace

bool InstallFile(const std::string& source, const std::string& destination,
                 std::uint32_t copyStyle, bool* inUse) {
    *inUse = false;
    if (files::Copy(source, destination, false)) return true;
    if (LastError() != kErrorSharingViolation || !(copyStyle & kCopyInUseNeedsReboot)) return false;
    if (!StageAndQueue(source, destination)) return false;
    *inUse = true;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

}  // namespace plat::setup

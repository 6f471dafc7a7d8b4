// Windows paths: the C run-time split and merge rules, the current directory and drive, and
// the mapping between Windows paths and host paths through the machine root.
#pragma once
#include <string>

namespace plat::paths {

// _splitpath: drive ("C:"), directory (with its trailing separator), file name, extension
// (with its dot). Either separator counts. Missing parts are empty.
struct PathParts {
    std::string drive, dir, fname, ext;
};
PathParts SplitPath(const std::string& path);

// _makepath: drive, then directory (a separator added when it lacks one), file name, then
// extension (a dot added when it lacks one).
std::string MakePath(const PathParts& parts);

// Path merge: the flags select each part from the first path (bits 0-3: ext, fname, dir,
// drive) or else from the second (bits 4-7); an unselected part is left out.
std::string ComposePath(const std::string& first, const std::string& second, unsigned char flags);

// Appends a backslash unless the text is empty or already ends in one.
std::string AddSeparator(const std::string& dir);

// The process's current directory as a Windows path (always with a drive, no trailing
// separator except for a drive root "C:\").
std::string CurrentDirectory();
// Changes the current directory; false and the last error (2/3) when it does not exist.
bool ChangeDirectory(const std::string& winPath);
// The letter of the current drive, upper case.
char CurrentDrive();

// The absolute Windows form of a path: relative paths against the current directory,
// "\x" against the current drive, "." and ".." folded, '/' turned into '\'.
std::string FullPath(const std::string& winPath);

// The host path of a Windows path. Existing components are matched without regard to
// ASCII case; the rest keep the case given. Empty when the drive is not mapped (last
// error 3).
std::string ToHost(const std::string& winPath);

// The Windows path of a host path: inside a drive it is that drive's path, otherwise Z:\...
std::string ToWindows(const std::string& hostPath);

}  // namespace plat::paths

// The Windows search for a bare program or library name, shared by process start and library
// load: which folders are searched, in which order, and which spellings of the name are tried.
#pragma once
#include <string>
#include <vector>

namespace plat::search {

// The folders searched, as Windows paths: the folder of the host program, then (withSystem)
// C:\windows\system32, then the current folder, then each PATH entry (host entries such as
// /usr/bin shown as Z:\usr\bin). Empty entries are left out.
std::vector<std::string> Folders(bool withSystem);

// True when the name carries a drive or a separator, so it names a path and is not searched.
bool NamesPath(const std::string& name);

// The host path of the first of names that is a regular file in the first folder holding one
// (folders are tried in order, names in order within each folder); empty when none is.
std::string Find(const std::vector<std::string>& folders, const std::vector<std::string>& names);

// The host path of winPath when it is a regular file; empty otherwise.
std::string ExistingFile(const std::string& winPath);

// True when the folder part of winPath exists (a path with no folder part counts as existing).
bool FolderExists(const std::string& winPath);

}  // namespace plat::search

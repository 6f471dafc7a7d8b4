// Flushing a folder, so that the names in it (created, renamed, deleted, linked) survive a power
// cut: flushing a file makes its bytes durable, never the name that finds it.
#pragma once
#include <string>

namespace plat::posix {

// Flushes the folder at the host path; false with errno set when it could not.
bool FlushFolder(const std::string& hostFolder);

// FlushFolder, or only notes the folder when a files::FolderFlushBatch of this thread gathers them.
void FlushFolderOrNote(const std::string& hostFolder);

// The folder of a host path.
std::string FolderOf(const std::string& hostPath);

}  // namespace plat::posix

// The durable state of the machine, for the fault plan's power cuts (test-only; nothing is kept
// until a plan asks for a cut). The rules, what survives a power cut:
//   - a file's bytes (and its mode and times) are durable as they stand when the file is flushed;
//   - the names in a folder (created, renamed, deleted, linked) are durable as they stand when
//     that folder is flushed, and only then. A flush of a file does not carry the names of its
//     folder: that is all that POSIX promises (fsync of a file says nothing of the entry that
//     names it), and what a file system without a journal (FAT on a stick, ext2) gives. The
//     kinder rule of journalled file systems (a file's flush commits every earlier name change)
//     would hide exactly the missing folder flushes that such a disk shows;
//   - a file created and never flushed is empty; a folder created and never flushed is empty;
//   - the registry (SQLite, synchronous=FULL) is durable at each committed transaction, so it is
//     not modelled: it stays as it is at the cut.
// Only drive C is modelled; the registry and the dosdevices links stay as they are.
#pragma once
#include <string>

namespace plat::power {

// Starts keeping the durable state: everything on drive C counts as durable now.
void Start();

// Stops keeping it.
void Stop();

// Replaces drive C by what survives the cut. seed 0 keeps nothing that was not made durable;
// any other seed keeps a random subset of the changes that were not (each folder's names
// together, as a folder's block reaches the disk whole or not at all, and each file's bytes),
// as a disk that reorders its writes may. Stops keeping the state.
void Cut(unsigned seed);

// The platform's flushes report here (the posix backend; Windows flushes for real).
void FileFlushed(int fd);
void FolderFlushed(const std::string& hostFolder);

}  // namespace plat::power

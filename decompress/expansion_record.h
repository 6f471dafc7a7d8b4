// The expansion record: a small file beside a download, "<download>.$exp$", that names the
// exact bytes (size, CRC-32 and Adler-32) that the download holds once it has been
// expanded in place.
//
// Why: the content file says that a download still needs expanding until the pipeline saves it
// after the expansion. A run that ends between the two leaves an expanded download under a row
// that asks for expansion, and expanding it again would fail for ever. The record is written
// before the expanded data takes the download's name, so a later run can tell that state apart
// from a compressed download, positively: only the very bytes named are taken as expanded. A
// record that names other bytes (the run ended before the swap, or the download was replaced
// since) is stale and is removed.
#pragma once
#include <string>

// "<path>.$exp$".
std::string ExpansionRecordName(const std::string& path);

// Writes the record of the bytes now in expandedFile for the download at path, durably.
// False, with the last error set, when the file cannot be read or the record written.
bool RecordExpansion(const std::string& path, const std::string& expandedFile);

// True when a record beside path names exactly the bytes that path holds.
bool IsRecordedExpansion(const std::string& path);

// Removes the record beside path, if any; true when none is left.
bool DiscardExpansionRecord(const std::string& path);

// ExpandInPlace: replaces a downloaded file by its expansion, by way of a temporary copy of the
// compressed data: copy the file to a new temporary name, open the copy for reading and the
// file itself anew for writing, expand one into the other, close both, delete the copy.
//
// Returns true when expand gave zero or more. Every step writes its trace line, prefixed
// "CDecompressionObjects::<operation>, ". The file is left as it was on every failure: before
// it is opened for writing nothing touches it; once it has been truncated and the expansion
// fails, the compressed data is copied back from the temporary copy. When that copy back fails
// too, the temporary copy is kept (its name is in the log) so the download is not lost; in every
// other case no temporary file remains.
#pragma once
#include <cstdint>
#include <functional>
#include <string>

#include "platform/cfile.h"

// Expands source (open for reading, at its start) into destination (new, empty, open for
// writing). Zero or more on success, negative on failure; must not throw.
using Expander = std::function<std::int32_t(plat::CFile& source, plat::CFile& destination)>;

bool ExpandInPlace(const char* operation, const std::string& path, const Expander& expand);

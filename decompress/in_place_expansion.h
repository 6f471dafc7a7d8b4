// ExpandInPlace: replaces a downloaded file by its expansion without ever leaving it torn: the
// download is read and expanded into a staging file beside it ("<download>.$new$"), which is
// flushed, recorded (expansion_record.h) and then renamed over the download in one step.
//
// Returns true when expand gave zero or more and the expansion took the download's place, and
// also, without expanding again, when the download already holds the expansion that its record
// names (a run ended after the swap, before the content file said so). Every step writes its
// trace line, prefixed "CDecompressionObjects::<operation>, ". On every failure the download
// stays exactly as it arrived and no staging file remains; a run ended at any moment leaves
// either the whole download or the whole expansion under the download's name.
#pragma once
#include <cstdint>
#include <functional>
#include <string>

#include "platform/cfile.h"

// Expands source (open for reading, at its start) into destination (new, empty, open for
// writing). Zero or more on success, negative on failure; must not throw.
using Expander = std::function<std::int32_t(plat::CFile& source, plat::CFile& destination)>;

bool ExpandInPlace(const char* operation, const std::string& path, const Expander& expand);

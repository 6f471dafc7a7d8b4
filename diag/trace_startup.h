// The trace log's configuration when the library starts: its file beside the library, its
// substitution pair, and the rotation of the previous run's log to its backup.
#pragma once
#include <string>

#include "diag/trace_log.h"

// The substitution pair that start-up installs (see trace_startup.cpp for why).
extern const char* const kTraceHiddenWord;
extern const char* const kTraceHiddenWordToken;

// Points the log at "<folder of the module>\log\pex_support_mendler.log", creating the "log"
// folder and any missing parents outermost first (failures unreported: the first line's open
// then fails and file output goes off). Without a module path (empty, or 1024 characters or
// more, which the module-name buffer cannot hold) the file is "c:\log.log". Then: substitution
// pair set; keepOpen off; file closed; fileOutput on for the chosen file; Backup, so the
// previous log becomes the ".bak" beside it and the new log starts with the first line traced
// (a log that cannot be copied to its ".bak" stays, and the new lines follow it).
void ConfigureTraceLog(TraceLog& log, const std::string& modulePath);

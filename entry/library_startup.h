// What the library does when it is loaded, before anything can call it: point the trace log at
// its file beside the module, rotate the previous log, write the banner and support snapshot.
#pragma once
#include <string>

// modulePath: the Windows path of the module that holds the library code.
void StartLibrary(const std::string& modulePath);
// Closes the trace log; never throws.
void StopLibrary();

// The batch of registry writes on Windows (reg_transaction.h). Wine lacks the system's transacted
// registry, so a batch keeps a journal instead: while one is open, every write first records how
// to undo itself, and a batch that ends without committing undoes them, latest first. Other
// processes see the writes at once; within the process a batch takes effect whole or not at all.
#pragma once
#include <string>

#include "platform/win32/windows_api.h"

namespace plat::reg::win32::journal {

// Opens a batch; false when one was open already (the new one joins it).
bool Begin();
// Ends the outermost batch: its writes stay (commit) or are undone.
void End(bool commit);

// Called before the write they name, whether or not a batch is open.
void BeforeSetValue(HKEY key, const std::string& name);
void BeforeDeleteValue(HKEY key, const std::string& name);
void BeforeDeleteKey(HKEY parent, const std::string& subKey);
// Called before CreateKey with the path below parent; records the removal of what it adds.
void BeforeCreateKey(HKEY parent, const std::string& subKey);

}  // namespace plat::reg::win32::journal

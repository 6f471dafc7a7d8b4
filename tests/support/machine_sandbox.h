// On Windows the tests run on the real machine (a throw-away Wine prefix). So that every test
// still starts from the same machine, the sandbox remembers what the machine held before the
// first test of the run and removes what tests add to it: entries of the drive's top folder,
// of Program Files, of the temporary and system folders, keys at the top of the hives, below
// Software and among the classes, and the restart queue.
#pragma once

namespace pextest::sandbox {

// Takes the baseline when the run has none yet (it is kept in a file of the Windows folder,
// so every test program of the run shares it), then removes everything added since.
// Clears the fault plan first, so that the removal itself cannot be made to fail.
void Restore();

}  // namespace pextest::sandbox

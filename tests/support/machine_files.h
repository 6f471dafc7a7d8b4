// A test machine's files before and after the code under test, kept as data: lines of
//   scenario | before | Windows path | bytes     written by PlaceFiles
//   scenario | after  | Windows path | bytes     checked by ExpectFiles
// in a case file (case_file.h); bytes go through Unescape, "(missing)" stands for no file and
// "(empty)" for a file without bytes.
#pragma once
#include <string>

#include "tests/support/test_machine.h"

namespace pextest {

void PlaceFiles(const TestMachine& machine, const std::string& casesFile, const std::string& scenario);
void ExpectFiles(const TestMachine& machine, const std::string& casesFile, const std::string& scenario);

}  // namespace pextest

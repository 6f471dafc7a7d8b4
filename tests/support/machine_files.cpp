#include "tests/support/machine_files.h"

#include <gtest/gtest.h>

#include "platform/files.h"
#include "tests/support/case_file.h"

namespace pextest {
namespace {

std::string Bytes(const std::string& field) { return field == "(empty)" ? "" : Unescape(field); }

}  // namespace

void PlaceFiles(const TestMachine& machine, const std::string& casesFile, const std::string& scenario) {
    for (const Case& c : ReadCases(casesFile))
        if (c[0] == scenario && c[1] == "before") machine.WriteFile(c[2], Bytes(c[3]));
}

void ExpectFiles(const TestMachine& machine, const std::string& casesFile, const std::string& scenario) {
    for (const Case& c : ReadCases(casesFile)) {
        if (c[0] != scenario || c[1] != "after") continue;
        SCOPED_TRACE(c.where);
        const std::string actual = plat::files::Exists(c[2]) ? machine.ReadFile(c[2]) : "(missing)";
        EXPECT_EQ(actual, c[3] == "(missing)" ? c[3] : Bytes(c[3]));
    }
}

}  // namespace pextest

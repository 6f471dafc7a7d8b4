// Tables of test cases kept as data: a text file of one case a line, its fields separated by
// " | ", read by the test that owns it. Lines that are blank or start with '#' are comments.
// A field is taken verbatim (backslashes are the paths' and scripts' own), trimmed of the blanks
// around it; Unescape reads \n, \t, \r, \xHH and \\ where a table needs bytes a line cannot hold.
#pragma once
#include <string>
#include <vector>

namespace pextest {

struct Case {
    std::string where;  // "file:line", for SCOPED_TRACE
    std::vector<std::string> fields;

    const std::string& operator[](std::size_t i) const;  // a missing field reads as ""
};

// The cases of tests/<relative>; a file that cannot be read fails the calling test.
std::vector<Case> ReadCases(const std::string& relative);

std::string Unescape(const std::string& field);

}  // namespace pextest

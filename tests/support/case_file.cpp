#include "tests/support/case_file.h"

#include <gtest/gtest.h>

#include <cctype>
#include <fstream>

namespace pextest {
namespace {

std::string Trim(const std::string& s) {
    const auto begin = s.find_first_not_of(" \t\r");
    if (begin == std::string::npos) return std::string();
    return s.substr(begin, s.find_last_not_of(" \t\r") - begin + 1);
}

std::vector<std::string> Fields(const std::string& line) {
    std::vector<std::string> fields;
    std::size_t start = 0;
    for (std::size_t bar; (bar = line.find(" | ", start)) != std::string::npos; start = bar + 3)
        fields.push_back(Trim(line.substr(start, bar - start)));
    fields.push_back(Trim(line.substr(start)));
    return fields;
}

}  // namespace

const std::string& Case::operator[](std::size_t i) const {
    static const std::string empty;
    return i < fields.size() ? fields[i] : empty;
}

std::vector<Case> ReadCases(const std::string& relative) {
    const std::string path = std::string(PEX_TESTS_DIR) + "/" + relative;
    std::ifstream in(path, std::ios::binary);
    EXPECT_TRUE(in.good()) << "cannot read the cases in " << path;
    std::vector<Case> cases;
    std::string line;
    for (int number = 1; std::getline(in, line); ++number) {
        const std::string text = Trim(line);
        if (text.empty() || text[0] == '#') continue;
        cases.push_back(Case{relative + ":" + std::to_string(number), Fields(text)});
    }
    EXPECT_FALSE(cases.empty()) << path << " holds no cases";
    return cases;
}

std::string Unescape(const std::string& field) {
    std::string out;
    for (std::size_t i = 0; i < field.size(); ++i) {
        if (field[i] != '\\' || i + 1 == field.size()) {
            out += field[i];
            continue;
        }
        const char c = field[++i];
        if (c == 'n') out += '\n';
        else if (c == 't') out += '\t';
        else if (c == 'r') out += '\r';
        else if (c == 'x' && i + 2 < field.size() && std::isxdigit(static_cast<unsigned char>(field[i + 1])) &&
                 std::isxdigit(static_cast<unsigned char>(field[i + 2]))) {
            out += static_cast<char>(std::stoi(field.substr(i + 1, 2), nullptr, 16));
            i += 2;
        } else {
            out += c;  // \\ and any other escaped character stand for themselves
        }
    }
    return out;
}

}  // namespace pextest

// The output of `reg query`, as the Windows command prints it: a blank line, the key's full
// name, then each value on a line of its own, indented by four blanks, with name, type and
// data separated by four blanks ((Default) names the unnamed value); the subkeys after.
#pragma once
#include <string>

#include "platform/reg_path.h"
#include "platform/reg_tree.h"

namespace plat::reg {

struct QueryOptions {
    bool recursive = false;  // /s: every key below, each with its values
    bool oneValue = false;   // /v NAME or /ve: only the value valueName ("" for the default)
    std::string valueName;
};

// "    name    TYPE    data".
std::string ValueLine(const Value& value);

// Appends the output for the key to out. Without /s the subkeys follow as a list of full
// names; with /s each subkey follows as a block of its own. With /v and /s only the keys
// holding the value are listed, and a count of matches ends the output. 0, or the Windows
// code: 2 when the key is missing or the value named is found nowhere.
long Query(const KeyPath& key, const QueryOptions& options, std::string* out);

}  // namespace plat::reg

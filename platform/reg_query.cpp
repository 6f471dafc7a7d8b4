// The output of `reg query`.
#include "platform/reg_query.h"

#include "platform/errors.h"
#include "platform/reg_data.h"

namespace plat::reg {

namespace {

const char kIndent[] = "    ";

struct Walk {
    const QueryOptions& options;
    std::string* out;
    int matches = 0;
};

// The block of one key: blank line, name, values. With /v only a key holding the value has one.
long KeyBlock(HKey key, const KeyPath& path, Walk& walk) {
    std::vector<Value> values;
    if (long rc = ReadValues(key, &values)) return rc;
    std::string lines;
    for (const Value& v : values) {
        if (walk.options.oneValue && !NamesEqual(v.name, walk.options.valueName)) continue;
        lines += ValueLine(v);
        ++walk.matches;
    }
    if (walk.options.oneValue && lines.empty()) return 0;
    *walk.out += "\n" + path.FullName() + "\n" + lines;
    return 0;
}

long QueryKey(const KeyPath& path, Walk& walk) {
    Key key;
    if (long rc = OpenKey(path.root, path.subKey, kKeyRead, key.out())) return rc;
    if (long rc = KeyBlock(key.get(), path, walk)) return rc;
    std::vector<std::string> children;
    if (long rc = SubKeyNames(key.get(), &children)) return rc;
    if (!walk.options.recursive) {
        if (walk.options.oneValue || children.empty()) return 0;
        *walk.out += "\n";
        for (const std::string& child : children) *walk.out += path.Child(child).FullName() + "\n";
        return 0;
    }
    for (const std::string& child : children)
        if (long rc = QueryKey(path.Child(child), walk)) return rc;
    return 0;
}

}  // namespace

std::string ValueLine(const Value& value) {
    return kIndent + (value.name.empty() ? std::string("(Default)") : value.name) + kIndent +
           TypeName(value.type) + kIndent + DataText(value.type, value.data) + "\n";
}

long Query(const KeyPath& key, const QueryOptions& options, std::string* out) {
    Walk walk{options, out};
    if (long rc = QueryKey(key, walk)) return rc;
    if (options.oneValue && options.recursive)
        *out += "\nEnd of search: " + std::to_string(walk.matches) + " match(es) found.\n";
    else if (options.oneValue && walk.matches == 0)
        return kErrorFileNotFound;
    return 0;
}

}  // namespace plat::reg

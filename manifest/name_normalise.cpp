#include "manifest/name_normalise.h"

#include "commands/item_list.h"

std::string NormaliseName(const std::string& name) {
    std::string out = TrimItem(name);
    for (char& c : out)
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    return out;
}

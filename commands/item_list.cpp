#include "commands/item_list.h"

std::string TrimItem(const std::string& text) {
    const std::string::size_type first = text.find_first_not_of(kItemBlanks);
    if (first == std::string::npos) return std::string();
    const std::string::size_type last = text.find_last_not_of(kItemBlanks);
    return text.substr(first, last - first + 1);
}

std::vector<std::string> SplitItemList(const std::string& text, char separator) {
    std::vector<std::string> items;
    std::string rest = text;
    for (;;) {
        const std::string::size_type at = rest.find(separator);
        const std::string item = TrimItem(rest.substr(0, at));
        rest = at == std::string::npos ? std::string() : TrimItem(rest.substr(at + 1));
        // An empty item still counts while text follows it; only the tail yields nothing.
        if (item.empty() && rest.empty()) break;
        items.push_back(item);
    }
    return items;
}

// Item lists: a text split at a separator (";" unless told otherwise) into trimmed items. The
// content file keeps several lists in single cells this way (install commands, component
// names, dependencies), so every part of the library splits them by the same rule.
#pragma once
#include <string>
#include <vector>

// The characters trimmed from items: blank, tab and line feed. Carriage returns are kept.
constexpr const char* kItemBlanks = " \t\n";

// The text without blanks, tabs and line feeds at either end.
std::string TrimItem(const std::string& text);

// Splits text at separator, trimming every item and the remaining text at both ends. Two
// separators in a row yield an empty item; separators (and blanks) at the very end yield
// none, so "a;b; ;" gives {"a", "b"} and "a;;b" gives {"a", "", "b"}. There is no quoting:
// an item cannot contain the separator.
std::vector<std::string> SplitItemList(const std::string& text, char separator = ';');

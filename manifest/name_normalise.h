// Names compared in sets (special files, group names): trimmed of blanks, tabs and line feeds,
// with the ASCII letters a to z upper-cased.
#pragma once
#include <string>

std::string TrimBlanks(const std::string& text);  // blanks, tabs and line feeds at both ends
std::string NormaliseName(const std::string& name);

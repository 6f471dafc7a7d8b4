// Names compared in sets (special files, group names): trimmed of blanks, tabs and line feeds,
// with the ASCII letters a to z upper-cased.
#pragma once
#include <string>

std::string NormaliseName(const std::string& name);

// The hosting framework's application profile (GetProfileString of the application object),
// through which the parser reads its framework-level settings.
#pragma once
#include <string>

std::string ApplicationProfileString(const std::string& section, const std::string& entry,
                                     const std::string& dflt);

// The components of the Vantric suite whose versions the support snapshot records, and the
// registry keys it dumps.
#pragma once
#include <string>
#include <vector>

struct SuiteComponent {
    enum Kind { File, ProgId };
    Kind kind;
    std::string text;  // a file name beside the host program, or a programmatic identifier
};

// 26 entries: 9 files (the first "Mendler.DLL") and 17 programmatic identifiers.
const std::vector<SuiteComponent>& SuiteComponentList();
// 42 key paths with long root names, each ended by CR LF.
const std::string& SuiteRegistryKeyList();

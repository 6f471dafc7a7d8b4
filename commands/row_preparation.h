// Preparation of a freshly loaded content table: status normalisation, install directories made
// absolute, and every row's dynamic-field script run against its row.
#pragma once
#include <cstdint>
#include <string>

#include "manifest/content_table.h"

// Loads the table (header, ',') and prepares its rows; a negative result is the load failure,
// returned before anything else runs. A table without a "FileName" or an "UpgradeStatus"
// column fails the load (the table's LoadFailure says which).
std::int32_t LoadContentRows(CContentTable& table, const std::string& path,
                             const std::string& defaultDirectory);
// Replaces every row's "HomeDir" by its resolved form.
void ResolveHomeDirs(CContentTable& table, const std::string& defaultDirectory);
// Parses, validates and executes every row's "DynamicFieldInfo" script; returns 0.
std::int32_t EvaluateDynamicFields(CContentTable& table);

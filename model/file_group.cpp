#include "model/file_group.h"

#include "commands/item_list.h"
#include "diag/trace_log.h"

CFileGroup::CFileGroup(const std::string& name) : name_(name) {
    TRACE(g_TraceLog, "CFileGroup: Empty group constructor complete.  Group name is '%s'",
          name_.c_str());
}

CFileGroup::CFileGroup(const CFileGroup& other)
    : files_(other.files_),
      dependancies_(other.dependancies_),
      name_(other.name_),
      retries_(other.retries_) {
    TRACE(g_TraceLog, "CFileGroup: STL constructor complete");
}

bool CFileGroup::IsGroupDecompressed() const {
    bool decompressed = true;
    for (const CFile_& file : files_) {
        if (file.IsDecompressionNeeded()) {
            decompressed = false;
            break;
        }
    }
    TRACE(g_TraceLog, "CFileGroup: IsGroupDecompressed complete %d", decompressed);
    return decompressed;
}

bool CFileGroup::IsGroupApplied() const {
    bool applied = true;
    for (const CFile_& file : files_) {
        if (!file.IsApplied()) {
            applied = false;
            break;
        }
    }
    TRACE(g_TraceLog, "CFileGroup: IsGroupApplied complete %d", applied);
    return applied;
}

bool CFileGroup::AddFileToGroup(const CFile_& file) {
    const std::size_t before = files_.size();
    files_.push_back(file);
    const std::size_t now = files_.size();
    TRACE(g_TraceLog, "CFileGroup: AddFileToGroup, before was %d, now is %d",
          static_cast<int>(before), static_cast<int>(now));
    return now == before + 1;
}

bool CFileGroup::AddDependancies(const std::string& text) {
    TRACE(g_TraceLog, "CFileGroup: AddDependancies, input is '%s'", text.c_str());
    bool result = true;
    for (const std::string& name : SplitItemList(text)) {
        result = AddDependancy(name) && result;
    }
    TRACE(g_TraceLog, "CFileGroup: AddDependancies, return value is %d", result);
    return result;
}

bool CFileGroup::AddDependancy(const std::string& name) {
    TRACE(g_TraceLog, "CFileGroup: AddDependancy, input is '%s'", name.c_str());
    const std::size_t before = dependancies_.size();
    dependancies_.insert(name);
    const std::size_t now = dependancies_.size();
    TRACE(g_TraceLog, "CFileGroup: AddDependancy, before was %d now is %d",
          static_cast<int>(before), static_cast<int>(now));
    return now == before + 1;
}

bool CFileGroup::AddFileAndDependancies(const CFile_& file, const std::string& text) {
    if (!AddFileToGroup(file)) return false;
    return AddDependancies(text);
}

bool CFileGroup::IncrementRetries() {
    ++retries_;
    return true;
}

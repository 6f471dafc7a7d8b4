#include "model/master_list.h"

#include <new>

#include "diag/trace_log.h"

CMasterList::CMasterList() { TRACE(g_TraceLog, "CMasterList constructor"); }

std::string CMasterList::GroupKey(const std::string& name) {
    std::string key = name;
    for (char& c : key) {
        if (c >= 'a' && c <= 'z') c = static_cast<char>(c - 'a' + 'A');
    }
    return key;
}

// multimap::find may give any of several equal keys; the first one made is the one that counts.
CMasterList::iterator CMasterList::FindFirst(const std::string& key) {
    const iterator found = groups_.lower_bound(key);
    return found != groups_.end() && found->first == key ? found : groups_.end();
}

CMasterList::const_iterator CMasterList::FindFirst(const std::string& key) const {
    const const_iterator found = groups_.lower_bound(key);
    return found != groups_.end() && found->first == key ? found : groups_.end();
}

CMasterList::iterator CMasterList::AddNewFileGroup(const std::string& name) {
    TRACE(g_TraceLog, "CMasterList AddNewFileGroup, group name is '%s'", name.c_str());
    try {
        const CFileGroup group(name);
        return groups_.emplace(GroupKey(name), group);
    } catch (const std::bad_alloc&) {
        return groups_.end();
    }
}

bool CMasterList::AddFile(const std::string& groupName, const CFile_& file,
                          const std::string& dependancies) {
    TRACE(g_TraceLog, "CMasterList AddFile, group name is '%s', dependancy data is '%s'",
          groupName.c_str(), dependancies.c_str());
    iterator group = groups_.end();
    if (groupName.empty()) {
        group = AddNewFileGroup(groupName);
    } else {
        TRACE(g_TraceLog, "CMasterList Named Group section...");
        group = FindFirst(GroupKey(groupName));
        if (group == groups_.end()) {
            TRACE(g_TraceLog, "CMasterList adding group as group was not found");
            group = AddNewFileGroup(groupName);
        } else {
            TRACE(g_TraceLog, "CMasterList found group...");
        }
    }
    bool result = false;
    if (group == groups_.end()) {
        TRACE(g_TraceLog, "CMasterList unable to create file group");
    } else {
        TRACE(g_TraceLog, "CMasterList adding file to group, file is '%s', depending on '%s'",
              file.GetFileName().c_str(), dependancies.c_str());
        result = group->second.AddFileAndDependancies(file, dependancies);
        if (result) ++filesAdded_;
    }
    TRACE(g_TraceLog, "CMasterList AddFile returning %d", result);
    return result;
}

bool CMasterList::DependedOnItemsApplied(const_iterator group) const {
    TRACE(g_TraceLog, "CMasterList DependedOnItemsApplied");
    bool result = true;
    if (group->first.empty()) {
        TRACE(g_TraceLog, "CMasterList vacuously true condition");
    } else {
        const std::set<std::string>& names = group->second.GetDependancies();
        TRACE(g_TraceLog, "CMasterList checking dependancies, %d to check",
              static_cast<int>(names.size()));
        for (auto name = names.begin(); result && name != names.end(); ++name) {
            TRACE(g_TraceLog, "CMasterList examining dependancy '%s'", name->c_str());
            const std::string key = GroupKey(*name);
            TRACE(g_TraceLog, "Searching CMasterList for '%s'", key.c_str());
            const const_iterator found = FindFirst(key);
            if (found != groups_.end()) {
                TRACE(g_TraceLog, "CMasterList found dependancy '%s'", name->c_str());
                result = found->second.IsGroupApplied();
            } else {
                TRACE(g_TraceLog,
                      "Did not find item in master list, setting leaving all ready set to %s.",
                      result ? "true" : "false");
            }
        }
    }
    TRACE(g_TraceLog, "CMasterList DependedOnItemsApplied, returning %d", result);
    return result;
}

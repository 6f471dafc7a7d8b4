// CFileGroup: update files that are applied and rolled back together, with the names of the
// groups that must be applied before them and the number of times the apply pipeline deferred
// the group. Nothing here throws.
#pragma once
#include <cstdint>
#include <list>
#include <set>
#include <string>

#include "model/update_file.h"

class CFileGroup {
public:
    // No members, no dependencies, no retries. name keeps the case in which it was written.
    explicit CFileGroup(const std::string& name);
    CFileGroup(const CFileGroup& other);  // every field, traced: the master list holds copies
    CFileGroup& operator=(const CFileGroup& other) = default;

    // True when no member needs decompressing (an empty group included).
    bool IsGroupDecompressed() const;
    // True when every member is applied (an empty group included); asks the members in order
    // and stops at the first that is not.
    bool IsGroupApplied() const;

    // Appends a copy of the file; true when the group grew by one member.
    bool AddFileToGroup(const CFile_& file);
    // Adds every name of a ";"-separated list (items trimmed of blanks, tabs and line feeds;
    // an empty item between separators is the empty name; nothing follows the last name). True
    // when every name was new; a repeated name is kept once.
    bool AddDependancies(const std::string& text);
    // Adds one name as written; false when it was there already.
    bool AddDependancy(const std::string& name);
    // AddFileToGroup, then AddDependancies when the file was added; the file stays a member
    // even when a dependency name was a repeat.
    bool AddFileAndDependancies(const CFile_& file, const std::string& text);

    bool IncrementRetries();  // always true
    std::int32_t GetRetries() const { return retries_; }

    const std::string& GetName() const { return name_; }
    // The names in ascending byte order.
    const std::set<std::string>& GetDependancies() const { return dependancies_; }
    // The members in the order in which they were added. A list, so that adding a member never
    // copies the others.
    std::list<CFile_>& GetFiles() { return files_; }
    const std::list<CFile_>& GetFiles() const { return files_; }

private:
    std::list<CFile_> files_;
    std::set<std::string> dependancies_;
    std::string name_;
    std::int32_t retries_ = 0;
};

// CMasterList: every file group of one product run. Groups are keyed by their name with the
// ASCII letters a to z upper-cased, walked in ascending byte order of that key, and groups
// with equal keys in the order in which they were made. Files without a group name each get a
// group of their own with the empty name, so a walk meets them first, in the order they came.
// Nothing here throws.
#pragma once
#include <cstdint>
#include <map>
#include <string>

#include "model/file_group.h"
#include "model/update_file.h"

class CMasterList {
public:
    // A multimap keeps equal keys in insertion order.
    using GroupMap = std::multimap<std::string, CFileGroup>;
    using iterator = GroupMap::iterator;
    using const_iterator = GroupMap::const_iterator;

    CMasterList();

    // Makes a group named name, placed after any group with the same key; end() only when it
    // could not be made.
    iterator AddNewFileGroup(const std::string& name);

    // Adds a copy of the file, and the dependency names of the text, to the first group whose
    // key matches groupName (made when there is none; an empty groupName always makes a new
    // group). True when the file was added and every dependency name was new to the group;
    // only then does the file count in GetFilesAdded. The file stays a member either way.
    bool AddFile(const std::string& groupName, const CFile_& file, const std::string& dependancies);

    // Whether the group may be applied: true for a group without a name (its dependencies are
    // not examined); otherwise true unless a dependency name, compared without regard to ASCII
    // case, finds a group (the first with that key) that is not applied. Names that find no
    // group count as met.
    bool DependedOnItemsApplied(const_iterator group) const;

    iterator begin() { return groups_.begin(); }
    iterator end() { return groups_.end(); }
    const_iterator begin() const { return groups_.begin(); }
    const_iterator end() const { return groups_.end(); }
    GroupMap& GetGroups() { return groups_; }
    const GroupMap& GetGroups() const { return groups_; }

    // The files whose AddFile returned true.
    std::int32_t GetFilesAdded() const { return filesAdded_; }

    // The key of a group name: ASCII a to z upper-cased, every other byte kept (no trimming).
    static std::string GroupKey(const std::string& name);

private:
    iterator FindFirst(const std::string& key);
    const_iterator FindFirst(const std::string& key) const;

    GroupMap groups_;
    std::int32_t filesAdded_ = 0;
};

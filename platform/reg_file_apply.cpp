// Carrying out the changes of a .reg file, all or nothing.
#include "platform/errors.h"
#include "platform/reg_file.h"
#include "platform/reg_transaction.h"
#include "platform/reg_tree.h"

namespace plat::reg {

namespace {

std::string Describe(long code) {
    switch (code) {
        case kErrorFileNotFound: return "not found";
        case kErrorAccessDenied: return "access denied";
        default: return "error " + std::to_string(code);
    }
}

long Fail(long code, int line, const std::string& what, RegFileError* error) {
    error->line = line;
    error->message = what + ": " + Describe(code) + " (" + std::to_string(code) + ")";
    return code;
}

// The key that value entries write to: the one of the last section, opened once.
class CurrentKey {
public:
    long For(const KeyPath& path) {
        if (key_ && path.root == path_.root && NamesEqual(path.subKey, path_.subKey)) return 0;
        path_ = path;
        return CreateKey(path.root, path.subKey, kKeyAllAccess, key_.out(), nullptr);
    }
    HKey get() const { return key_.get(); }
    void Forget() { key_.Reset(); }

private:
    Key key_;
    KeyPath path_;
};

long ApplyEntry(const RegFileEntry& e, CurrentKey& current) {
    using Kind = RegFileEntry::Kind;
    if (e.kind == Kind::DeleteKey) {
        current.Forget();
        long rc = DeleteTree(e.key.root, e.key.subKey);
        return rc == kErrorFileNotFound ? 0 : rc;
    }
    if (long rc = current.For(e.key)) return rc;
    if (e.kind == Kind::SetValue) {
        return SetValue(current.get(), e.name, e.type,
                        reinterpret_cast<const std::uint8_t*>(e.data.data()),
                        static_cast<std::uint32_t>(e.data.size()));
    }
    if (e.kind == Kind::DeleteValue) {
        long rc = DeleteValue(current.get(), e.name);
        return rc == kErrorFileNotFound ? 0 : rc;
    }
    return 0;
}

std::string Target(const RegFileEntry& e) {
    if (e.kind == RegFileEntry::Kind::SetValue || e.kind == RegFileEntry::Kind::DeleteValue)
        return "value \"" + e.name + "\" of " + e.key.FullName();
    return e.key.FullName();
}

}  // namespace

long ApplyRegFile(const std::vector<RegFileEntry>& entries, RegFileError* error) {
    Transaction batch;
    if (long rc = batch.Status()) return Fail(rc, 0, "cannot write the registry", error);
    CurrentKey current;
    for (const RegFileEntry& e : entries) {
        if (long rc = ApplyEntry(e, current)) return Fail(rc, e.line, Target(e), error);
    }
    current.Forget();
    if (long rc = batch.Commit()) return Fail(rc, 0, "cannot commit the import", error);
    return 0;
}

long ImportRegFile(const std::string& fileBytes, RegFileError* error) {
    std::vector<RegFileEntry> entries;
    if (!ParseRegFile(fileBytes, &entries, error)) return kErrorInvalidParameter;
    return ApplyRegFile(entries, error);
}

}  // namespace plat::reg

// One registry write on the emulated machine: checks that the registry may be written, runs
// in a transaction of its own (or in the open batch), and asks the fault plan just before the
// database changes. Internal to the posix registry; used under db::Lock().
#pragma once

namespace plat::reg::db {

class WriteScope {
public:
    WriteScope() = default;
    WriteScope(const WriteScope&) = delete;
    WriteScope& operator=(const WriteScope&) = delete;
    ~WriteScope();  // rolls back a transaction of its own that was not committed

    // 0, or 5 when the registry cannot be written, or the code of a failed BEGIN.
    long Begin();
    // Called once just before the first change: 0, or the code the fault plan chose.
    long Allow();
    // Commits a transaction of its own; inside a batch the batch decides.
    long Commit();

private:
    bool own_ = false;
    bool allowed_ = false;
};

}  // namespace plat::reg::db

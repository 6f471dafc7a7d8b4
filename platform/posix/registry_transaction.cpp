// A batch of registry writes: one SQLite transaction around them.
#include "platform/errors.h"
#include "platform/posix/registry_db.h"
#include "platform/reg_transaction.h"

namespace plat::reg {

Transaction::Transaction() {
    auto lock = db::Lock();
    if ((status_ = db::Open()) != 0 || (status_ = db::CheckWritable()) != 0) return;
    generation_ = db::Generation();
    outer_ = db::BatchDepth() == 0;
    // IMMEDIATE: the batch holds the write lock from the start, so it cannot fail half-way
    // because another process wrote in between.
    if (outer_ && (status_ = db::Exec("BEGIN IMMEDIATE")) != 0) return;
    ++db::BatchDepth();
    open_ = true;
}

Transaction::~Transaction() {
    auto lock = db::Lock();
    // A change of machine root has closed the connection and with it the batch.
    if (!open_ || generation_ != db::Generation()) return;
    --db::BatchDepth();
    if (outer_) db::Exec("ROLLBACK");
}

long Transaction::Commit() {
    auto lock = db::Lock();
    if (!open_) return status_ ? status_ : long{kErrorInvalidHandle};
    if (generation_ != db::Generation()) return kErrorInvalidHandle;
    open_ = false;
    --db::BatchDepth();
    if (!outer_) return 0;
    long rc = db::Exec("COMMIT");
    if (rc) db::Exec("ROLLBACK");
    return rc;
}

}  // namespace plat::reg

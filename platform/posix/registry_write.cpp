// One registry write on the emulated machine.
#include "platform/posix/registry_write.h"

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/posix/registry_db.h"

namespace plat::reg::db {

WriteScope::~WriteScope() {
    if (own_) Exec("ROLLBACK");
}

long WriteScope::Begin() {
    if (long rc = CheckWritable()) return rc;
    if (BatchDepth() > 0) return 0;
    // IMMEDIATE takes the write lock now (waiting out other processes), so the reads that
    // decide the change and the change itself see one state of the registry.
    if (long rc = Exec("BEGIN IMMEDIATE")) return rc;
    own_ = true;
    return 0;
}

long WriteScope::Allow() {
    if (allowed_) return 0;
    if (!plat::fault::Allow(plat::fault::Op::RegWrite)) {
        std::uint32_t code = plat::LastError();
        return code ? code : kErrorAccessDenied;
    }
    allowed_ = true;
    return 0;
}

long WriteScope::Commit() {
    if (!own_) return 0;
    own_ = false;
    long rc = Exec("COMMIT");
    if (rc) Exec("ROLLBACK");
    return rc;
}

}  // namespace plat::reg::db

// A batch of registry writes on Windows, kept by the undo journal (registry_journal.h).
#include "platform/reg_transaction.h"

#include "platform/errors.h"
#include "platform/win32/registry_journal.h"

namespace plat::reg {

Transaction::Transaction() : status_(0), open_(true), outer_(win32::journal::Begin()) {}

Transaction::~Transaction() {
    if (open_) win32::journal::End(false);
}

long Transaction::Commit() {
    if (!open_) return status_ ? status_ : long{kErrorInvalidHandle};  // already ended
    open_ = false;
    win32::journal::End(true);
    return 0;
}

}  // namespace plat::reg

// A batch of registry writes on Windows. The system's transacted registry (RegCreateKeyTransacted)
// exists on Windows Vista and later but not under Wine, where the tests run, so a batch here
// groups nothing: every write takes effect at once and a batch that is not committed leaves
// its writes in place.
#include "platform/reg_transaction.h"

namespace plat::reg {

Transaction::Transaction() : status_(0), open_(true) {}

Transaction::~Transaction() = default;

long Transaction::Commit() {
    open_ = false;
    return 0;
}

}  // namespace plat::reg

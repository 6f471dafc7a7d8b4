// A batch of registry writes that take effect together or not at all, such as the import of
// a .reg file. While a batch is open, the registry writes of the process join it; a batch
// opened inside another joins the outer one, which alone commits or rolls back. Other
// processes see nothing of the batch until it commits, and wait for it when they write.
#pragma once
#include <cstdint>

namespace plat::reg {

class Transaction {
public:
    // Begins the batch; Status() tells whether it could (5 when the registry is read-only).
    Transaction();
    // Rolls back every write of the batch unless Commit succeeded.
    ~Transaction();
    Transaction(const Transaction&) = delete;
    Transaction& operator=(const Transaction&) = delete;

    long Status() const { return status_; }
    // Makes the writes permanent: 0, or the code of the failure (then nothing was written).
    long Commit();

private:
    long status_ = 0;
    bool open_ = false;
    bool outer_ = false;
    std::uint64_t generation_ = 0;
};

}  // namespace plat::reg

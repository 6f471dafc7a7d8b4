// Bytes that a parser reads piece by piece at offsets, so that it reads only the parts of a file
// it needs: a file on the disk (plat::files::RegularFile) or bytes already in memory.
#pragma once
#include <cstddef>
#include <cstdint>
#include <string>

namespace plat {

class ByteSource {
public:
    virtual ~ByteSource() = default;
    virtual std::uint64_t Size() const = 0;
    // The n bytes at offset at into *bytes; false when they do not all lie inside the source or
    // cannot be read.
    virtual bool ReadAt(std::uint64_t at, std::size_t n, std::string* bytes) const = 0;
};

// Bytes in memory; the string must outlive the source.
class MemorySource final : public ByteSource {
public:
    explicit MemorySource(const std::string& bytes) : bytes_(bytes) {}
    std::uint64_t Size() const override { return bytes_.size(); }
    bool ReadAt(std::uint64_t at, std::size_t n, std::string* bytes) const override {
        if (at > bytes_.size() || n > bytes_.size() - at) return false;
        bytes->assign(bytes_, static_cast<std::size_t>(at), n);
        return true;
    }

private:
    const std::string& bytes_;
};

}  // namespace plat

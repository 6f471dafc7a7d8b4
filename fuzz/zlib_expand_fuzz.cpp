// The zlib path of the decompressor over any bytes: a download marked "ZLIB" is whatever
// arrived. InflateFile must fail cleanly on corrupt or short streams, give the byte count it
// wrote, and keep its progress within its total.
//
// First byte: bit 0 chooses the mode (0: inflate the rest as it is; 1: deflate the rest as a
// zlib stream, or as a gzip stream with bit 1, then inflate it and compare), bits 2-7 the
// compression level.
#include <zlib.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "decompress/zlib_expand.h"
#include "platform/cfile.h"

namespace {

void Check(bool condition) {
    if (!condition) std::abort();
}

// A CFile over bytes in memory, as InflateFile reads and writes its files.
class MemoryFile : public plat::CFile {
public:
    explicit MemoryFile(std::string bytes = std::string()) : bytes_(std::move(bytes)) {}
    std::uint32_t Read(void* buffer, std::uint32_t count) override {
        const std::size_t n = std::min<std::size_t>(count, bytes_.size() - position_);
        std::memcpy(buffer, bytes_.data() + position_, n);
        position_ += n;
        return static_cast<std::uint32_t>(n);
    }
    void Write(const void* buffer, std::uint32_t count) override {
        bytes_.append(static_cast<const char*>(buffer), count);
        position_ = bytes_.size();
    }
    std::uint64_t Seek(std::int64_t offset, unsigned from) override {
        const std::int64_t base = from == begin ? 0 : from == current ? static_cast<std::int64_t>(position_)
                                                                      : static_cast<std::int64_t>(bytes_.size());
        position_ = static_cast<std::size_t>(std::clamp<std::int64_t>(base + offset, 0, bytes_.size()));
        return position_;
    }
    std::uint64_t GetLength() const override { return bytes_.size(); }
    std::uint64_t GetPosition() const override { return position_; }
    void Flush() override {}
    void Close() override {}
    const std::string& Bytes() const { return bytes_; }

private:
    std::string bytes_;
    std::size_t position_ = 0;
};

void Progress(SCompressPerformance& report) { Check(report.processed <= report.total); }

std::int32_t Inflate(const std::string& data, std::string* expanded) {
    MemoryFile source(data), destination;
    std::string why;
    const std::int32_t result = InflateFile(source, destination, Progress, &why);
    if (result >= 0) {
        Check(static_cast<std::size_t>(result) == destination.Bytes().size());
    } else {
        Check(!why.empty());
    }
    *expanded = destination.Bytes();
    return result;
}

std::string Deflate(const std::string& data, int level, bool gzip) {
    z_stream z{};
    Check(deflateInit2(&z, level, Z_DEFLATED, gzip ? 15 + 16 : 15, 8, Z_DEFAULT_STRATEGY) == Z_OK);
    std::string out(deflateBound(&z, data.size()) + 32, '\0');
    z.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(data.data()));
    z.avail_in = static_cast<uInt>(data.size());
    z.next_out = reinterpret_cast<Bytef*>(&out[0]);
    z.avail_out = static_cast<uInt>(out.size());
    Check(deflate(&z, Z_FINISH) == Z_STREAM_END);
    out.resize(z.total_out);
    deflateEnd(&z);
    return out;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::uint8_t mode = data[0];
    const std::string rest(reinterpret_cast<const char*>(data) + 1, size - 1);
    std::string expanded;
    if ((mode & 1) == 0) {
        Inflate(rest, &expanded);
        return 0;
    }
    const std::string packed = Deflate(rest, (mode >> 2) % 10, (mode & 2) != 0);
    Check(Inflate(packed, &expanded) == static_cast<std::int32_t>(rest.size()));
    Check(expanded == rest);
    return 0;
}

#include "decompress/zlib_expand.h"

#include <zlib.h>

#include <memory>
#include <new>

#include "decompress/inflate_progress.h"

namespace {

constexpr std::uint32_t kBlock = 64 * 1024;
// 15 window bits, plus 32: recognise a zlib or a gzip header.
constexpr int kWindowBitsAnyHeader = 15 + 32;

class Inflater {
public:
    Inflater() { ready_ = inflateInit2(&stream_, kWindowBitsAnyHeader) == Z_OK; }
    ~Inflater() {
        if (ready_) inflateEnd(&stream_);
    }
    Inflater(const Inflater&) = delete;
    Inflater& operator=(const Inflater&) = delete;
    bool Ready() const { return ready_; }
    z_stream& Stream() { return stream_; }

private:
    z_stream stream_{};
    bool ready_ = false;
};

std::int32_t Fail(int code, const char* text, std::string* why) {
    *why = text ? text : "corrupt data";
    return code;
}

// The expansion proper; CFile failures leave it as exceptions.
std::int32_t Inflate(plat::CFile& source, plat::CFile& destination, InflateProgress& progress, std::string* why) {
    std::unique_ptr<Bytef[]> in(new (std::nothrow) Bytef[kBlock]);
    std::unique_ptr<Bytef[]> out(new (std::nothrow) Bytef[kBlock]);
    Inflater inflater;
    if (!in || !out || !inflater.Ready()) return Fail(Z_MEM_ERROR, "not enough memory", why);
    z_stream& z = inflater.Stream();
    std::uint64_t consumed = 0, written = 0;
    bool inStream = true;  // a stream has begun and not yet ended
    for (;;) {
        if (z.avail_in == 0) {
            z.next_in = in.get();
            z.avail_in = source.Read(in.get(), kBlock);
            if (z.avail_in == 0) break;
        }
        if (!inStream) {
            inflateReset(&z);  // another stream follows the one that ended
            inStream = true;
        }
        const uInt before = z.avail_in;
        z.next_out = out.get();
        z.avail_out = kBlock;
        const int rc = inflate(&z, Z_NO_FLUSH);
        if (rc == Z_NEED_DICT) return Fail(Z_DATA_ERROR, "the stream needs a preset dictionary", why);
        if (rc != Z_OK && rc != Z_STREAM_END && !(rc == Z_BUF_ERROR && z.avail_in == 0))
            return Fail(rc == Z_MEM_ERROR ? Z_MEM_ERROR : Z_DATA_ERROR, z.msg, why);
        const std::uint32_t produced = kBlock - z.avail_out;
        if (produced) destination.Write(out.get(), produced);
        written += produced;
        consumed += before - z.avail_in;
        progress.Advance(consumed);
        if (rc == Z_STREAM_END) inStream = false;
    }
    if (inStream)
        return Fail(Z_BUF_ERROR, consumed == 0 ? "the file is empty" : "the data ends before the end of the stream", why);
    return written > 0x7FFFFFFFu ? 0x7FFFFFFF : static_cast<std::int32_t>(written);
}

}  // namespace

std::int32_t InflateFile(plat::CFile& source, plat::CFile& destination, void (*progress)(SCompressPerformance&),
                         std::string* why) {
    std::uint64_t total = 0;
    try {
        total = source.GetLength() - source.GetPosition();
    } catch (const plat::CFileException& e) {
        *why = "cannot read '" + e.FileName() + "', error " + std::to_string(e.OsError());
        return Z_ERRNO;
    }
    InflateProgress reports(progress, total);
    reports.Start();
    std::int32_t result;
    try {
        result = Inflate(source, destination, reports, why);
    } catch (const plat::CFileException& e) {
        *why = "file error " + std::to_string(e.OsError()) + " on '" + e.FileName() + "'";
        result = Z_ERRNO;
    } catch (const std::exception& e) {
        *why = e.what();
        result = Z_ERRNO;
    }
    reports.End(result);
    return result;
}

#include "decompress/expansion_record.h"

#include <zlib.h>

#include <cinttypes>
#include <cstdio>
#include <memory>
#include <new>

#include "platform/cfile.h"
#include "platform/files.h"

namespace {

constexpr std::uint32_t kBlock = 64 * 1024;

// "<size> <CRC-32> <Adler-32>" of a file's bytes (both sums are fast in zlib); empty when
// it cannot be read.
std::string Fingerprint(const std::string& path) {
    plat::CFile file;
    std::unique_ptr<unsigned char[]> buffer(new (std::nothrow) unsigned char[kBlock]);
    if (!buffer || !file.Open(path, plat::CFile::modeRead | plat::CFile::shareDenyWrite | plat::CFile::typeBinary))
        return std::string();
    std::uint64_t size = 0;
    uLong crc = crc32(0L, Z_NULL, 0), adler = adler32(0L, Z_NULL, 0);
    try {
        for (std::uint32_t got; (got = file.Read(buffer.get(), kBlock)) > 0; size += got) {
            crc = crc32(crc, buffer.get(), got);
            adler = adler32(adler, buffer.get(), got);
        }
        file.Close();
    } catch (const plat::CFileException&) {
        return std::string();
    }
    char text[64];
    std::snprintf(text, sizeof text, "%" PRIu64 " %08lx %08lx", size, static_cast<unsigned long>(crc),
                  static_cast<unsigned long>(adler));
    return text;
}

}  // namespace

std::string ExpansionRecordName(const std::string& path) { return path + ".$exp$"; }

bool RecordExpansion(const std::string& path, const std::string& expandedFile) {
    const std::string fingerprint = Fingerprint(expandedFile);
    return !fingerprint.empty() && plat::files::WriteAllDurably(ExpansionRecordName(path), fingerprint);
}

bool IsRecordedExpansion(const std::string& path) {
    std::string recorded;
    if (!plat::files::ReadAll(ExpansionRecordName(path), &recorded)) return false;
    return !recorded.empty() && recorded == Fingerprint(path);
}

bool DiscardExpansionRecord(const std::string& path) {
    const std::string record = ExpansionRecordName(path);
    return !plat::files::Exists(record) || plat::files::Remove(record);
}

// Byte source and sink over the framework's CFile, for the module's exported entries. CFile
// reports failures by throwing; these turn any exception into the codec's error results, so no
// exception leaves Rivzip.dll. Only CFile's virtual operations are called, so the module does not
// link the framework: it works on whatever CFile object its caller opened.
#pragma once
#include "platform/cfile.h"
#include "rivzip/byte_stream.h"

namespace rivzip {

class CFileSource : public ByteSource {
public:
    explicit CFileSource(plat::CFile& file) : file_(file) {}
    std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) override;

private:
    plat::CFile& file_;
};

class CFileSink : public ByteSink {
public:
    explicit CFileSink(plat::CFile& file) : file_(file) {}
    bool Write(const std::uint8_t* data, std::uint32_t count) override;

private:
    plat::CFile& file_;
};

}  // namespace rivzip

// The byte source and byte sink that the SZDD codec reads and writes. The codec knows nothing of
// files, so it can be driven from memory in tests and from CFile objects in the module.
#pragma once
#include <cstdint>

namespace rivzip {

class ByteSource {
public:
    virtual ~ByteSource() = default;
    // Reads up to count bytes; returns the number read (0 only at the end, fewer than asked is
    // allowed anywhere), or a negative value when the source cannot be read.
    virtual std::int64_t Read(std::uint8_t* buffer, std::uint32_t count) = 0;
};

class ByteSink {
public:
    virtual ~ByteSink() = default;
    // Writes all count bytes; false when they could not all be written.
    virtual bool Write(const std::uint8_t* data, std::uint32_t count) = 0;
};

}  // namespace rivzip

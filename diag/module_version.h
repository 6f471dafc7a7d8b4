// The file version of a module, as the start-up banner shows it.
#pragma once
#include <cstdint>
#include <string>

class ModuleVersion {
public:
    // Reads the file version of path; both halves 0 when it has no version information.
    explicit ModuleVersion(const std::string& path);
    virtual ~ModuleVersion() = default;

    int Major() const { return static_cast<int>(mostSignificant_ >> 16); }
    int Minor() const { return static_cast<int>(mostSignificant_ & 0xFFFF); }
    int Build() const { return static_cast<int>(leastSignificant_ >> 16); }
    int Revision() const { return static_cast<int>(leastSignificant_ & 0xFFFF); }

    // "Version 02.01.00.17" (twoDigits) or "Version 2.1.0.17", in one process-wide buffer.
    const char* Text(bool twoDigits) const;

private:
    std::uint32_t mostSignificant_ = 0;
    std::uint32_t leastSignificant_ = 0;
};

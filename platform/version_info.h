// Version information (VS_VERSIONINFO) of modules and programs: the fixed file information,
// the translations and the string table entries, as GetFileVersionInfo and VerQueryValue give
// them. Texts are returned single-byte: UTF-16 characters above 0xFF become '?'.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

namespace plat::ver {

// ERROR_RESOURCE_DATA_NOT_FOUND: the file is no module, or has no resources at all.
constexpr std::uint32_t kErrorResourceDataNotFound = 1812;
// ERROR_RESOURCE_TYPE_NOT_FOUND: a module without version information.
constexpr std::uint32_t kErrorResourceTypeNotFound = 1813;

// VS_FIXEDFILEINFO.
struct FixedFileInfo {
    std::uint32_t signature = 0;  // 0xFEEF04BD
    std::uint32_t structVersion = 0;
    std::uint32_t fileVersionMS = 0, fileVersionLS = 0;
    std::uint32_t productVersionMS = 0, productVersionLS = 0;
    std::uint32_t fileFlagsMask = 0, fileFlags = 0, fileOS = 0, fileType = 0, fileSubtype = 0;
    std::uint32_t fileDateMS = 0, fileDateLS = 0;
};
constexpr std::uint32_t kFixedFileInfoSignature = 0xFEEF04BDu;

// One entry of \VarFileInfo\Translation.
struct Translation {
    std::uint16_t language = 0;
    std::uint16_t codePage = 0;
};

// A parsed VS_VERSIONINFO block.
class VersionInfo {
public:
    // Parses a block as stored in a resource. False (and an empty object) when the block is
    // not a well-formed VS_VERSIONINFO.
    bool Parse(const std::string& block);

    // VerQueryValue(block, "\"): the fixed part; nullptr when the block has none.
    const FixedFileInfo* Fixed() const { return hasFixed_ ? &fixed_ : nullptr; }
    // VerQueryValue(block, "\VarFileInfo\Translation"), in stored order; empty when absent.
    const std::vector<Translation>& Translations() const { return translations_; }
    // VerQueryValue(block, "\StringFileInfo\<lang><cp>\<name>"): names compare without regard
    // to ASCII case, and either separator may be used. False when there is no such entry.
    bool QueryString(const std::string& subBlock, std::string* value) const;

    struct Entry {
        std::string table;  // "040904E4"
        std::string name;
        std::string value;
    };
    // Every string entry of every table, in stored order.
    const std::vector<Entry>& Strings() const { return strings_; }

private:
    bool hasFixed_ = false;
    FixedFileInfo fixed_;
    std::vector<Translation> translations_;
    std::vector<Entry> strings_;
};

// GetFileVersionInfo: the raw block of the file at a Windows path: the RT_VERSION resource of
// a PE file, or the ".pexver" section that the build stamps into our ELF modules and programs.
// False and the last error when there is none: 2/3 for a missing file, 1812 for a file that
// is no module (a folder, a device or a pipe included), 1813 for a module without version
// information. Only the headers and the part that holds the block are read.
bool ReadBlock(const std::string& winPath, std::string* block);

// ReadBlock followed by Parse; a block that does not parse gives 1813.
bool Read(const std::string& winPath, VersionInfo* info);

// The largest version block read from a file; far more than a block holds, whose length is a
// 16-bit field.
constexpr std::uint64_t kMaxBlockSize = 1u << 20;

// The name of the ELF section that carries a module's version block.
constexpr const char* kElfSection = ".pexver";

}  // namespace plat::ver

#include "tests/crash/crash_product.h"

#include <algorithm>
#include <filesystem>

#include "decompress/expansion_record.h"
#include "model/run_journal.h"
#include "platform/files.h"
#include "platform/reg_file.h"
#include "tests/support/test_registry.h"

namespace fs = std::filesystem;
namespace reg = plat::reg;

namespace pextest {

// The product's machine is kept as data in crash/product: the registry (machine.reg), the files
// before the run (before/<drive letter>/...) and the bytes each update file must leave (after/).
void CrashProduct::SetUp() {
    const fs::path folder = PEX_CRASH_PRODUCT;
    reg::RegFileError error;
    ASSERT_EQ(reg::ImportRegFile(ReadHostFile((folder / "machine.reg").string()), &error), 0) << error.message;
    for (const auto& entry : fs::recursive_directory_iterator(folder / "before")) {
        if (!entry.is_regular_file()) continue;
        std::string path = fs::relative(entry.path(), folder / "before").string();  // C/App/core.dll
        std::replace(path.begin(), path.end(), '/', '\\');
        machine.WriteFile(path.insert(1, ":"), ReadHostFile(entry.path().string()));
    }
    const CContentTable table = Content();
    for (std::uint32_t row = 0; row + 1 < table.RowCount(); ++row) {  // the last row is keep.dll's
        ProductFile file;
        file.name = table.Field(row, "FileName");
        file.download = table.Field(row, "DownLoadCacheFile");
        file.expanded = table.Field(row, "NeedsDecompression") == "1";
        file.oldBytes = Contents(file.Target());
        file.hadTarget = file.oldBytes != "(missing)";
        file.published = Contents(file.download);
        file.newBytes = ReadHostFile((folder / "after" / file.name).string());
        files_.push_back(file);
    }
    ASSERT_TRUE(plat::files::SetAttributes(files_[1].Target(), plat::files::kAttrReadOnly));
}

std::string CrashProduct::Contents(const std::string& winPath) {
    std::string bytes;
    return plat::files::ReadAll(winPath, &bytes) ? bytes : std::string("(missing)");
}

std::vector<std::string> CrashProduct::Backups(const std::string& target) {
    std::vector<std::string> found;
    // A gap in the chain is possible (an earlier backup removed), so look a little further.
    std::string name = target + ".$bak$";
    for (int i = 0; i < 8; ++i, name += "x") {
        if (name != kForeignBackup && plat::files::Exists(name)) found.push_back(Contents(name));
    }
    return found;
}

std::vector<std::string> CrashProduct::Names(const std::string& pattern) {
    std::vector<std::string> names;
    for (const auto& entry : plat::files::Find(pattern)) {
        // A durable write ended between its flush and its rename leaves its temporary file
        // (".pex~<name>.XXXXXX") beside the file it was to replace; nothing reads it.
        if (entry.name.rfind(".pex~", 0) != 0) names.push_back(entry.name);
    }
    return names;
}

bool CrashProduct::ContentNamed() const {
    std::string bytes;
    return GetRegValue(reg::kLocalMachine, std::string("Software\\Vantric\\Pex\\") + kProduct,
                       "ContentFileName", &bytes);
}

void CrashProduct::ExpectConsistent() const {
    // A complete success deletes the content file, then its entries, the name last.
    ExpectLookAlikesUntouched();
    const bool named = ContentNamed(), present = plat::files::Exists(kContent);
    if (!named || !present) {
        EXPECT_FALSE(present) << "a content file that no entry names";
        for (const ProductFile& file : files_) ExpectFileConsistent(file, nullptr, -1);
        return;
    }
    CContentTable table;
    ASSERT_EQ(table.LoadFromFile(kContent, true, ','), CContentTable::kOk) << "the content file does not load";
    ASSERT_EQ(table.RowCount(), files_.size() + 1);
    for (std::size_t i = 0; i < files_.size(); ++i) {
        ASSERT_EQ(table.Field(static_cast<std::uint32_t>(i), "FileName"), files_[i].name);
        ExpectFileConsistent(files_[i], &table, static_cast<int>(i));
    }
}

// What the bytes are to the file: its previous version, its new one, its published download, or
// something else (torn). Names keep failure messages short.
std::string CrashProduct::Which(const ProductFile& file, const std::string& bytes) {
    if (bytes == "(missing)") return bytes;
    if (file.hadTarget && bytes == file.oldBytes) return "old";
    if (bytes == file.newBytes) return "new";
    if (bytes == file.published) return "published";
    return "other (" + std::to_string(bytes.size()) + " bytes)";
}

void CrashProduct::ExpectFileConsistent(const ProductFile& file, const CContentTable* table, int row) const {
    SCOPED_TRACE(file.name);
    const auto index = static_cast<std::uint32_t>(row);
    const std::string status = table ? table->Field(index, "UpgradeStatus") : "(discarded)";
    const bool committed = !table || status == "AppliedSuccessfully";
    const std::string target = Which(file, Contents(file.Target()));
    if (file.hadTarget) {
        EXPECT_TRUE(target == "old" || target == "new") << "target " << target;
    } else {
        EXPECT_TRUE(target == "(missing)" || target == "new") << "target " << target;
    }
    if (committed) {
        EXPECT_EQ(target, "new") << "status " << status;
    }
    bool previousKept = false;
    for (const std::string& backup : Backups(file.Target())) {
        // A new file that an ended run had put in place is backed up like any file found there.
        EXPECT_EQ(Which(file, backup), file.hadTarget ? "old" : "new") << "a backup of something else";
        previousKept = previousKept || Which(file, backup) == "old";
    }
    if (!committed && file.hadTarget && target == "new") {
        EXPECT_TRUE(previousKept) << "the previous version is gone, status " << status;
    }
    if (committed) return;
    // A download still to be decompressed may already hold its expansion when the run ended
    // before saving the row, as long as its expansion record vouches for exactly those bytes.
    const bool compressed = table->Field(index, "NeedsDecompression") == "1";
    const std::string download = Which(file, Contents(file.download));
    if (compressed && download == "new") {
        EXPECT_TRUE(IsRecordedExpansion(file.download)) << "an expanded download that asks for expansion";
    } else {
        EXPECT_EQ(download, compressed ? "published" : "new")
            << "the download, status " << status << ", NeedsDecompression " << (compressed ? 1 : 0);
    }
}

void CrashProduct::ExpectLookAlikesUntouched() const {
    EXPECT_EQ(Contents(kInstalled), "keep 1.0");
    EXPECT_EQ(Contents(kForeignBackup), "app 0.9, another tool's");
}

void CrashProduct::ExpectComplete(const std::vector<std::string>& downloadsLeft) const {
    ExpectLookAlikesUntouched();
    EXPECT_FALSE(ContentEntriesPresent());
    EXPECT_FALSE(plat::files::Exists(kContent));
    for (const ProductFile& file : files_) {
        EXPECT_EQ(Which(file, Contents(file.Target())), "new") << file.name;
        EXPECT_TRUE(Backups(file.Target()).empty()) << file.name << " has a backup left";
    }
    EXPECT_EQ(Names("C:\\App\\*"), (std::vector<std::string>{"app.exe", "app.exe.$bak$", "core.dll", "data.cfg", "keep.dll",
                                                   "packed.exe", "ran.txt", "readme.txt"}));
    EXPECT_EQ(Names("C:\\Pex\\cache\\*"), downloadsLeft) << "downloads left";
    EXPECT_FALSE(plat::files::Exists(CRunJournal::NameFor(kContent))) << "the run's journal is left";
    EXPECT_EQ(Names("C:\\windows\\temp\\*"), std::vector<std::string>{}) << "temporary files left";
    EXPECT_TRUE(plat::files::Exists(kRunMark));
    std::string value;
    EXPECT_TRUE(GetRegValue(reg::kLocalMachine, kRegistryMark, "Core", &value));
    EXPECT_EQ(value, std::string("2.0", 4));
}

}  // namespace pextest

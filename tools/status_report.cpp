#include "tools/status_report.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <set>

#include "commands/row_preparation.h"
#include "model/run_journal.h"
#include "model/upgrade_status.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/registry.h"

namespace reg = plat::reg;

namespace pextool::status {

namespace {

constexpr const char* kProductsKey = "software\\vantric\\Pex";
constexpr const char* kRejectedSuffix = ".rejected";

std::string Lower(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(), [](unsigned char c) { return std::tolower(c); });
    return text;
}

// A string value of the key, or empty.
std::string ReadText(reg::HKey key, const std::string& name) {
    std::uint8_t data[1024] = {};
    std::uint32_t size = sizeof data - 1;
    std::uint32_t type = 0;
    if (reg::QueryValue(key, name, &type, data, &size) != 0 || (type != reg::kRegSz && type != reg::kRegExpandSz))
        return std::string();
    return std::string(reinterpret_cast<const char*>(data));
}

bool ListProducts(reg::HKey products, std::vector<std::string>* names) {
    for (std::uint32_t index = 0;; ++index) {
        char name[256] = {};
        std::uint32_t size = 255;
        const long rc = reg::EnumKey(products, index, name, &size);
        if (rc == 259) return true;  // past the last product
        if (rc != 0) return false;
        names->push_back(name);
    }
}

void ReadContentFile(reg::HKey productKey, ProductStatus* product) {
    product->contentFile = ReadText(productKey, "ContentFileName");
    if (product->contentFile.empty()) return;
    product->present = plat::files::Exists(product->contentFile);
    if (!product->present) return;
    CContentTable table;
    std::string defaultPath = ReadText(productKey, "DefaultPath");
    if (defaultPath.empty()) defaultPath = ".";
    product->loaded = LoadContentRows(table, product->contentFile, defaultPath) >= 0;
    if (!product->loaded) {
        product->loadFailure = table.LoadFailure();
        return;
    }
    for (std::uint32_t row = 0; row < table.RowCount(); ++row) {
        const std::string& status = table.Field(row, "UpgradeStatus");
        ++product->statusCounts[status];
        if (status != UpgradeStatus[kAppliedSuccessfully])
            product->notApplied.push_back({row, table.Field(row, "FileName"), table.Field(row, "HomeDir"), status});
    }
}

void ReadJournal(ProductStatus* product) {
    if (product->contentFile.empty() || !plat::files::Exists(CRunJournal::NameFor(product->contentFile))) return;
    CRunJournal journal;
    journal.Open(product->contentFile);
    product->journal = journal.Path();
    for (const auto& [row, records] : journal.PendingRecords()) {
        JournalRow pending{row, "", ""};
        for (const CRunJournal::Record& record : records) {
            pending.steps += record.kind;
            if (pending.target.empty() && record.fields.size() >= 2) pending.target = record.fields[1];
        }
        product->interrupted.push_back(pending);
    }
}

// The files of the product: its rows' targets and the targets its journal names.
std::set<std::string> ProductFiles(const ProductStatus& product, const std::vector<RowState>& rows) {
    std::set<std::string> files;
    for (const RowState& row : rows) {
        std::string folder = row.folder;
        if (!folder.empty() && folder.back() != '\\') folder += '\\';
        files.insert(Lower(folder + row.fileName));
    }
    for (const JournalRow& row : product.interrupted)
        if (!row.target.empty()) files.insert(Lower(row.target));
    return files;
}

void MatchQueue(const std::vector<plat::setup::PendingRename>& queue, ProductStatus* product) {
    const std::set<std::string> files = ProductFiles(*product, product->notApplied);
    for (const plat::setup::PendingRename& op : queue)
        if (files.count(Lower(op.to)) || files.count(Lower(op.from))) product->queued.push_back(op);
}

void FindRejectedCopy(ProductStatus* product) {
    const std::string beside = product->contentFile + kRejectedSuffix;
    if (!product->contentFile.empty() && plat::files::Exists(beside)) product->rejectedCopy = beside;
}

}  // namespace

bool ProductStatus::NeedsAttention() const {
    return !notApplied.empty() || !interrupted.empty() || !queued.empty() || !rejectedCopy.empty() ||
           (present && !loaded) || (lastRun.hasResult && lastRun.result != 0);
}

bool Gather(const std::string& only, const std::string& traceLog, Report* report, std::string* error) {
    report->traceLog = traceLog;
    reg::Key products;
    const long opened = reg::OpenKey(reg::kLocalMachine, kProductsKey, reg::kKeyRead, products.out());
    std::vector<std::string> names;
    if (opened != 0 && opened != 2) {
        *error = "cannot open HKLM\\" + std::string(kProductsKey) + " (error " + std::to_string(opened) + ")";
        return false;
    }
    if (opened == 0 && !ListProducts(products.get(), &names)) {
        *error = "cannot list the products below HKLM\\" + std::string(kProductsKey);
        return false;
    }
    if (!only.empty()) {
        auto same = [&](const std::string& name) { return Lower(name) == Lower(only); };
        auto found = std::find_if(names.begin(), names.end(), same);
        if (found == names.end()) {
            *error = "no product '" + only + "' is registered below HKLM\\" + kProductsKey;
            return false;
        }
        names = {*found};
    }
    std::vector<plat::setup::PendingRename> queue;
    if (!plat::setup::ReadPendingRenames(&queue)) {
        *error = "cannot read the restart queue (PendingFileRenameOperations)";
        return false;
    }
    for (const std::string& name : names) {
        ProductStatus product;
        product.name = name;
        reg::Key key;
        if (reg::OpenKey(products.get(), name, reg::kKeyRead, key.out()) == 0) ReadContentFile(key.get(), &product);
        ReadJournal(&product);
        MatchQueue(queue, &product);
        FindRejectedCopy(&product);
        ReadLastRun(traceLog, &product);
        report->products.push_back(std::move(product));
    }
    return true;
}

int ExitCode(const Report& report) {
    for (const ProductStatus& product : report.products)
        if (product.NeedsAttention()) return 1;
    return 0;
}

std::string TraceLogBeside(const std::string& libraryPath) {
    const plat::paths::PathParts parts = plat::paths::SplitPath(libraryPath);
    return parts.drive + parts.dir + "log\\pex_support_mendler.log";
}

}  // namespace pextool::status

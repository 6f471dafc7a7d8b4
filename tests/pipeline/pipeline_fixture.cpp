#include "tests/pipeline/pipeline_fixture.h"

#include "tests/support/test_registry.h"

namespace reg = plat::reg;

namespace pextest {

namespace {

const std::vector<std::string> kColumns = {
    "FileName",  "UpgradeStatus",   "HomeDir",           "DynamicFieldInfo", "Force Download",
    "Snoozable", "InterestedParties", "DownLoadCacheFile", "FileGroup",        "DependancyOrder",
    "NeedsDecompression", "Command", "UpdateDate"};

std::string Join(const std::vector<std::string>& cells) {
    std::string line;
    for (size_t i = 0; i < cells.size(); ++i) line += (i ? "," : "") + cells[i];
    return line + "\r\n";
}

}  // namespace

void PipelineTest::Publish(const std::vector<ContentRow>& rows, const std::string& product, const std::string& content) {
    const std::string section = "Software\\Vantric\\Pex\\" + product;
    SetRegText(reg::kLocalMachine, section, "ContentFileName", content);
    SetRegText(reg::kLocalMachine, section, "ContentFileMode", "");
    SetRegText(reg::kLocalMachine, section, "ContentFileTarget", "");
    std::string text = Join(kColumns);
    for (const ContentRow& row : rows) {
        std::vector<std::string> cells;
        for (const std::string& column : kColumns) {
            auto it = row.find(column);
            cells.push_back(it == row.end() ? "" : it->second);
        }
        text += Join(cells);
    }
    machine.WriteFile(content, text);
}

ContentRow PipelineTest::Row(const std::string& fileName, const std::string& bytes, const std::string& group,
                             const std::string& dependancies) {
    const std::string download = "C:\\Pex\\cache\\" + fileName + ".new";
    machine.WriteFile(download, bytes);
    return {{"FileName", fileName},
            {"UpgradeStatus", "Downloaded"},
            {"HomeDir", kHome},
            {"InterestedParties", "Nobody"},  // no capabilities: LZW, harmless without decompression
            {"DownLoadCacheFile", download},
            {"FileGroup", group},
            {"DependancyOrder", dependancies},
            {"NeedsDecompression", "0"}};
}

CContentTable PipelineTest::Content() const {
    CContentTable table;
    table.LoadFromText(machine.ReadFile(kContent));
    return table;
}

bool PipelineTest::ContentEntriesPresent() const {
    const std::string section = std::string("Software\\Vantric\\Pex\\") + kProduct;
    std::string bytes;
    return GetRegValue(reg::kLocalMachine, section, "ContentFileName", &bytes) ||
           GetRegValue(reg::kLocalMachine, section, "ContentFileMode", &bytes) ||
           GetRegValue(reg::kLocalMachine, section, "ContentFileTarget", &bytes);
}

std::string PipelineTest::Installed(const std::string& fileName) const {
    return machine.ReadFile(std::string(kHome) + "\\" + fileName);
}

}  // namespace pextest

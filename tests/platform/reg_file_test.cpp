// .reg files: export and import reproduce a key exactly, a malformed or failing file changes
// nothing, every encoding a file may come in is read. The layout of an export and the output of
// `reg query` are the golden runs pexupdate_reg and pexupdate_reg_export.
#include "platform/reg_file.h"

#include <gtest/gtest.h>

#include <string>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/reg_data.h"
#include "platform/reg_text.h"
#include "platform/reg_tree.h"
#include "platform/registry.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace reg = plat::reg;

namespace {

class RegFileTest : public ::testing::Test {
protected:
    void TearDown() override { plat::fault::Clear(); }

    static reg::KeyPath Path(const std::string& text) {
        reg::KeyPath path;
        EXPECT_TRUE(reg::ParseKeyPath(text, &path)) << text;
        return path;
    }
    static void Set(const std::string& key, const std::string& name, std::uint32_t type,
                    const std::string& bytes) {
        pextest::SetRegValue(Path(key).root, Path(key).subKey, name, type, bytes);
    }
    // The value's type and bytes as "type:bytes", or "missing".
    static std::string Get(const std::string& key, const std::string& name) {
        std::string bytes;
        std::uint32_t type = 0;
        if (!pextest::GetRegValue(Path(key).root, Path(key).subKey, name, &bytes, &type)) return "missing";
        return std::to_string(type) + ":" + bytes;
    }
    static bool KeyExists(const std::string& key) { return pextest::RegKeyExists(Path(key).root, Path(key).subKey); }
    static std::string Export(const std::string& key) {
        std::string text;
        EXPECT_EQ(0, reg::ExportRegText(Path(key), &text));
        return text;
    }

    pextest::TestMachine machine_;
};

const char kProducts[] = "HKLM\\Software\\Vantric\\Pex";

TEST_F(RegFileTest, ExportThenImportReproducesEveryTypeAndOddBytes) {
    std::string everyByte;
    for (int i = 0; i < 256; ++i) everyByte += static_cast<char>(i);
    Set(std::string(kProducts) + "\\Zendor32", "Binary", reg::kRegBinary, everyByte);
    const auto values = pextest::ReadCases("platform/cases/reg_values.txt");
    const auto key = [](const pextest::Case& c) { return std::string(kProducts) + "\\" + c[0]; };
    const auto name = [](const pextest::Case& c) { return c[1] == "@" ? "" : pextest::Unescape(c[1]); };
    for (const pextest::Case& c : values)
        Set(key(c), name(c), static_cast<std::uint32_t>(std::stoul(c[2])), pextest::Unescape(c[3]));

    std::string file;
    ASSERT_EQ(0, reg::ExportRegFile(Path(kProducts), &file));
    const std::string before = Export(kProducts);
    ASSERT_EQ(0, reg::DeleteTree(reg::kLocalMachine, "Software\\Vantric"));
    ASSERT_FALSE(KeyExists(kProducts));

    reg::RegFileError error;
    ASSERT_EQ(0, reg::ImportRegFile(file, &error)) << error.line << ": " << error.message;
    EXPECT_EQ(before, Export(kProducts));
    EXPECT_EQ("3:" + everyByte, Get(std::string(kProducts) + "\\Zendor32", "Binary"));
    for (const pextest::Case& c : values) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(Get(key(c), name(c)), c[2] + ":" + pextest::Unescape(c[3]));
    }
}

TEST_F(RegFileTest, AMalformedLineIsNamedAndNothingOfTheFileIsImported) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/reg_imports.txt")) {
        SCOPED_TRACE(c.where);
        reg::RegFileError error;
        EXPECT_EQ(std::stol(c[1]), reg::ImportRegFile(pextest::Unescape(c[0]), &error));
        EXPECT_EQ(std::stoi(c[2]), error.line);
        EXPECT_NE(std::string::npos, error.message.find(c[3])) << error.message;
    }
    EXPECT_FALSE(KeyExists(kProducts));
}

TEST_F(RegFileTest, AChangeThatFailsUndoesTheWholeImport) {
    Set(kProducts, "Keep", reg::kRegSz, std::string("old\0", 4));
    const std::string file =
        "REGEDIT4\n[HKLM\\Software\\Vantric\\Pex]\n\"Keep\"=\"new\"\n[HKLM\\Software\\Other]\n"
        "\"x\"=\"y\"\n";
    plat::fault::FailNth(plat::fault::Op::RegWrite, 3, plat::kErrorAccessDenied);
    reg::RegFileError error;
    EXPECT_EQ(5, reg::ImportRegFile(file, &error));
    EXPECT_EQ(5, error.line);
    EXPECT_EQ(std::string("1:old\0", 6), Get(kProducts, "Keep"));
    EXPECT_FALSE(KeyExists("HKLM\\Software\\Other"));
}

TEST_F(RegFileTest, ImportReadsUtf16Utf8AndSingleByteFiles) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantric]\r\n"
        "\"Name\"=\"Caf\xE9\"\r\n";
    const std::string utf8 = "Windows Registry Editor Version 5.00\n"
                             "[HKCU\\Software\\Vantric]\n\"Name\"=\"Caf\xC3\xA9\"\n";
    for (const std::string& file :
         {"\xFF\xFE" + reg::ToUtf16(text), reg::ToUtf16(text), "\xEF\xBB\xBF" + utf8, utf8, text}) {
        reg::RegFileError error;
        ASSERT_EQ(0, reg::ImportRegFile(file, &error)) << error.line << ": " << error.message;
        EXPECT_EQ(std::string("1:Caf\xE9\0", 7), Get("HKCU\\Software\\Vantric", "Name"));
        ASSERT_EQ(0, reg::DeleteTree(reg::kCurrentUser, "Software\\Vantric"));
    }
}

TEST_F(RegFileTest, VersionFourTextsAreSingleByteAndDeletionsApply) {
    Set("HKCR\\.pex", "Old", reg::kRegSz, "x");
    Set("HKLM\\Software\\Gone\\Child", "v", reg::kRegSz, "x");
    const std::string file =
        "REGEDIT4\n"
        "; a comment\n"
        "[HKEY_CLASSES_ROOT\\.pex]\n"
        "@=\"C:\\Pex.File\"\n"  // a backslash that escapes nothing stays
        "\"Old\"=-\n"
        "\"Paths\"=hex(7):61,00,\\\n"
        "    62,00,00\n"
        "[-HKEY_LOCAL_MACHINE\\Software\\Gone]\n"
        "[-HKLM\\Software\\NeverThere]\n";
    reg::RegFileError error;
    ASSERT_EQ(0, reg::ImportRegFile(file, &error)) << error.line << ": " << error.message;
    EXPECT_EQ(std::string("1:C:\\Pex.File\0", 14), Get("HKLM\\Software\\Classes\\.pex", ""));
    EXPECT_EQ("missing", Get("HKCR\\.pex", "Old"));
    EXPECT_EQ(std::string("7:a\0b\0\0", 7), Get("HKCR\\.pex", "Paths"));
    EXPECT_FALSE(KeyExists("HKLM\\Software\\Gone"));
}

TEST_F(RegFileTest, AddDataIsConvertedByType) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/reg_data.txt")) {
        SCOPED_TRACE(c.where);
        std::string bytes, why;
        const bool converted = reg::DataFromText(static_cast<std::uint32_t>(std::stoul(c[0])), c[1], c[2], &bytes, &why);
        EXPECT_EQ(converted ? bytes : "refused", pextest::Unescape(c[3]));
    }
    std::uint32_t type = 0;
    EXPECT_TRUE(reg::TypeFromName("reg_expand_sz", &type));
    EXPECT_EQ(reg::kRegExpandSz, type);
    EXPECT_FALSE(reg::TypeFromName("REG_QWORD", &type));
}

}  // namespace

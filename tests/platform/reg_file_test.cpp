// .reg files and the output of `reg query`: export and import reproduce a key exactly, a
// malformed or failing file changes nothing, every encoding a file may come in is read.
#include "platform/reg_file.h"

#include <gtest/gtest.h>

#include <string>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/reg_data.h"
#include "platform/reg_query.h"
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

// Values are made in name order: Windows lists them in the order of creation, Wine by name.
TEST_F(RegFileTest, ExportIsUtf16WithTheLayoutOfTheRegistryEditor) {
    Set(kProducts, "Blob", reg::kRegBinary, std::string(30, '\xAB'));
    Set(kProducts, "Env", reg::kRegExpandSz, std::string("%a%\0", 4));
    Set(kProducts, "Mode", reg::kRegDword, std::string("\x02\0\0\0", 4));
    Set(kProducts, "Text", reg::kRegSz, std::string("C:\\x\0", 5));
    Set(std::string(kProducts) + "\\Sub", "", reg::kRegNone, "");
    std::string file;
    ASSERT_EQ(0, reg::ExportRegFile(Path(kProducts), &file));
    EXPECT_EQ("\xFF\xFE", file.substr(0, 2));
    std::string hexBlob = "\"Blob\"=hex:";
    for (int i = 0; i < 30; ++i) hexBlob += i == 0 ? "ab" : i == 22 ? ",\\\r\n  ab" : ",ab";
    EXPECT_EQ("Windows Registry Editor Version 5.00\r\n\r\n"
              "[HKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex]\r\n" +
                  hexBlob + "\r\n"
                  "\"Env\"=hex(2):25,00,61,00,25,00,00,00\r\n"
                  "\"Mode\"=dword:00000002\r\n"
                  "\"Text\"=\"C:\\\\x\"\r\n\r\n"
                  "[HKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Sub]\r\n"
                  "@=hex(0):\r\n\r\n",
              reg::FromUtf16(file.substr(2)));
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

// reg query /s /v NAME: the value in the key and in each subkey that has it, then the count.
// The plain listing of every type is checked through `pexupdate reg` (the golden run pexupdate_reg).
TEST_F(RegFileTest, RecursiveQueryOfOneValuePrintsLikeTheWindowsCommand) {
    const std::string key = std::string(kProducts) + "\\Zendor32";
    Set(key, "DefaultPath", reg::kRegSz, std::string("C:\\Program Files\\Vantric\0", 25));
    Set(key, "Mode", reg::kRegDword, std::string("\x1f\0\0\0", 4));
    Set(key + "\\Beta", "", reg::kRegNone, "");
    Set(key + "\\alpha", "Mode", reg::kRegExpandSz, std::string("%x%\0", 4));
    reg::QueryOptions options;
    options.recursive = options.oneValue = true;
    options.valueName = "MODE";
    std::string out;
    ASSERT_EQ(0, reg::Query(Path("hklm\\Software\\Vantric\\Pex\\Zendor32"), options, &out));
    EXPECT_EQ("\nHKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32\n"
              "    Mode    REG_DWORD    0x1f\n"
              "\nHKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32\\alpha\n"
              "    Mode    REG_EXPAND_SZ    %x%\n"
              "\nEnd of search: 2 match(es) found.\n",
              out);
    options.recursive = false;
    options.valueName = "Nothing";
    EXPECT_EQ(2, reg::Query(Path(key), options, &out));
    EXPECT_EQ(2, reg::Query(Path("HKCU\\Missing"), {}, &out));
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

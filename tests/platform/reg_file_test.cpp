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
    const std::string key = std::string(kProducts) + "\\Zendor32";
    Set(key, "", reg::kRegSz, std::string("default\0", 8));
    Set(key, "Quote\"And\\Slash", reg::kRegSz, std::string("C:\\Program Files\\\"x\"\0", 21));
    Set(key, "NoNul", reg::kRegSz, "abc");
    Set(key, "Empty", reg::kRegSz, "");
    Set(key, "NulOnly", reg::kRegSz, std::string(1, '\0'));
    Set(key, "Lines", reg::kRegSz, std::string("a\r\nb\0", 5));
    Set(key, "Expand", reg::kRegExpandSz, std::string("%TEMP%\\\xE9\xFF\0", 10));
    Set(key, "Multi", reg::kRegMultiSz, std::string("one\0two\0\0", 9));
    Set(key, "Dword", reg::kRegDword, std::string("\x1f\x00\x00\x80", 4));
    Set(key, "ShortDword", reg::kRegDword, "\x01");
    Set(key, "Binary", reg::kRegBinary, everyByte);
    Set(key, "EmptyBinary", reg::kRegBinary, "");
    Set(key, "None", reg::kRegNone, std::string("\0\x01", 2));
    Set(key, "Qword", 11, std::string("\x01\x02\x03\x04\x05\x06\x07\x08", 8));
    Set(key + "\\Nested\\Deeper", "\xC4name", reg::kRegSz, std::string("\xE4\0", 2));
    Set(std::string(kProducts) + "\\Orlandel", "DefaultPath", reg::kRegSz,
        std::string("C:\\\0", 4));

    std::string file;
    ASSERT_EQ(0, reg::ExportRegFile(Path(kProducts), &file));
    const std::string before = Export(kProducts);
    ASSERT_EQ(0, reg::DeleteTree(reg::kLocalMachine, "Software\\Vantric"));
    ASSERT_FALSE(KeyExists(kProducts));

    reg::RegFileError error;
    ASSERT_EQ(0, reg::ImportRegFile(file, &error)) << error.line << ": " << error.message;
    EXPECT_EQ(before, Export(kProducts));
    EXPECT_EQ("3:" + everyByte, Get(key, "binary"));
    EXPECT_EQ("1:abc", Get(key, "NoNul"));
    EXPECT_EQ("1:", Get(key, "Empty"));
    EXPECT_EQ(std::string("2:%TEMP%\\\xE9\xFF\0", 12), Get(key, "Expand"));
    EXPECT_EQ(std::string("1:\xE4\0", 4), Get(key + "\\Nested\\Deeper", "\xC4NAME"));
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
    const std::string file =
        "Windows Registry Editor Version 5.00\r\n"
        "\r\n"
        "[HKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32]\r\n"
        "\"DefaultPath\"=\"C:\\\\Program Files\"\r\n"
        "\"Mode\"=dword:1\r\n"
        "\"Bad\"=hex:01,02,\\\r\n"
        "  0g\r\n";
    reg::RegFileError error;
    EXPECT_EQ(87, reg::ImportRegFile(file, &error));
    EXPECT_EQ(6, error.line);
    EXPECT_NE(std::string::npos, error.message.find("hex")) << error.message;
    EXPECT_FALSE(KeyExists(kProducts));

    for (const auto& [text, line] : std::vector<std::pair<std::string, int>>{
             {"REGEDIT5\r\n", 1},
             {"REGEDIT4\n\n\"v\"=\"x\"\n", 3},
             {"REGEDIT4\n[HKEY_USERS\\x]\n", 2},
             {"REGEDIT4\n[HKLM\\x]\n\"v\"=dword:123456789\n", 3},
             {"REGEDIT4\n[HKLM\\x]\n\"v\"=\"open\n", 3},
             {"REGEDIT4\n[HKLM\\x]\n\"v\"\n", 3},
             {"REGEDIT4\n[HKLM\\x\n", 2},
             {"REGEDIT4\n[-HKLM\\x]\n\"v\"=\"x\"\n", 3}}) {
        EXPECT_EQ(87, reg::ImportRegFile(text, &error)) << text;
        EXPECT_EQ(line, error.line) << text;
    }
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
        "@=\"Pex.File\"\n"
        "\"Old\"=-\n"
        "\"Paths\"=hex(7):61,00,\\\n"
        "    62,00,00\n"
        "[-HKEY_LOCAL_MACHINE\\Software\\Gone]\n"
        "[-HKLM\\Software\\NeverThere]\n";
    reg::RegFileError error;
    ASSERT_EQ(0, reg::ImportRegFile(file, &error)) << error.line << ": " << error.message;
    EXPECT_EQ(std::string("1:Pex.File\0", 11), Get("HKLM\\Software\\Classes\\.pex", ""));
    EXPECT_EQ("missing", Get("HKCR\\.pex", "Old"));
    EXPECT_EQ(std::string("7:a\0b\0\0", 7), Get("HKCR\\.pex", "Paths"));
    EXPECT_FALSE(KeyExists("HKLM\\Software\\Gone"));
}

// reg query /s /v NAME: the value in the key and in each subkey that has it, then the count.
// The plain listing of every type is checked through `pexupdate reg` (reg_command_test.cpp).
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
    auto data = [](std::uint32_t type, const std::string& text, const std::string& separator = "\\0") {
        std::string bytes, why;
        return reg::DataFromText(type, text, separator, &bytes, &why) ? bytes : "<refused>";
    };
    EXPECT_EQ("\xff\xff\xff\xff", data(reg::kRegDword, "4294967295"));
    EXPECT_EQ(std::string("\x1f\0\0\0", 4), data(reg::kRegDword, "0x1F"));
    EXPECT_EQ("<refused>", data(reg::kRegDword, "4294967296"));
    EXPECT_EQ(std::string("a\0b\0\0", 5), data(reg::kRegMultiSz, "a#b", "#"));
    EXPECT_EQ(std::string("\0\xff", 2), data(reg::kRegBinary, "00fF"));
    EXPECT_EQ("<refused>", data(reg::kRegBinary, "abc"));
    EXPECT_EQ(std::string("%PATH%\0", 7), data(reg::kRegExpandSz, "%PATH%"));
    std::uint32_t type = 0;
    EXPECT_TRUE(reg::TypeFromName("reg_expand_sz", &type));
    EXPECT_EQ(reg::kRegExpandSz, type);
    EXPECT_FALSE(reg::TypeFromName("REG_QWORD", &type));
}

}  // namespace

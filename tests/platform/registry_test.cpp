// The registry of the machine: the codes of the Windows calls, names and order, and handles of
// another machine. Batches are tested through .reg imports (reg_file_test.cpp).
#include "platform/registry.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/errors.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"

namespace reg = plat::reg;

namespace {

class RegistryTest : public ::testing::Test {
protected:
    reg::Key Create(const std::string& path, std::uint32_t access = reg::kKeyAllAccess) {
        reg::Key key;
        EXPECT_EQ(0, reg::CreateKey(reg::kLocalMachine, path, access, key.out(), nullptr));
        return key;
    }
    static long SetText(reg::HKey key, const std::string& name, const std::string& bytes) {
        return reg::SetValue(key, name, reg::kRegSz,
                             reinterpret_cast<const std::uint8_t*>(bytes.data()),
                             static_cast<std::uint32_t>(bytes.size()));
    }
    static std::string Text(reg::HKey key, const std::string& name) {
        std::uint8_t buffer[256];
        std::uint32_t size = sizeof buffer;
        if (reg::QueryValue(key, name, nullptr, buffer, &size) != 0) return "<missing>";
        return std::string(reinterpret_cast<char*>(buffer), size);
    }
    static std::vector<std::string> SubKeys(reg::HKey key) {
        std::vector<std::string> names;
        char name[64];
        std::uint32_t size = sizeof name;
        for (std::uint32_t i = 0; reg::EnumKey(key, i, name, &size) == 0; ++i, size = sizeof name)
            names.push_back(name);
        return names;
    }

    pextest::TestMachine machine_;
};

TEST_F(RegistryTest, CreateReportsItsDispositionAndOpenFindsOnlyExistingKeys) {
    reg::Key key;
    std::uint32_t disposition = 0;
    EXPECT_EQ(0, reg::CreateKey(reg::kLocalMachine, "Software\\Vantric\\Pex", reg::kKeyAllAccess,
                                key.out(), &disposition));
    EXPECT_EQ(reg::kCreatedNewKey, disposition);
    EXPECT_EQ(0, reg::CreateKey(reg::kLocalMachine, "SOFTWARE\\vantric\\PEX", reg::kKeyAllAccess,
                                key.out(), &disposition));
    EXPECT_EQ(reg::kOpenedExistingKey, disposition);

    EXPECT_EQ(0, reg::OpenKey(reg::kLocalMachine, "software\\VANTRIC", reg::kKeyRead, key.out()));
    EXPECT_EQ(2, reg::OpenKey(reg::kLocalMachine, "Software\\Vantric\\Missing", reg::kKeyRead,
                              key.out()));
    EXPECT_EQ(2u, plat::LastError());
    EXPECT_FALSE(key);
    EXPECT_EQ(2, reg::OpenKey(reg::kLocalMachine, "No\\Such\\Parent", reg::kKeyRead, key.out()));
    EXPECT_EQ(2, reg::OpenKey(reg::kCurrentUser, "Software\\Vantric", reg::kKeyRead, key.out()));
}

TEST_F(RegistryTest, SubkeysEnumerateInCaseInsensitiveOrderKeepingTheirCase) {
    reg::Key parent = Create("Software\\Order");
    for (const char* name : {"charlie", "Alpha", "bravo", "_under", "Zulu", "alpha2"}) {
        reg::Key child;
        ASSERT_EQ(0, reg::CreateKey(parent.get(), name, reg::kKeyAllAccess, child.out(), nullptr));
    }
    EXPECT_EQ((std::vector<std::string>{"_under", "Alpha", "alpha2", "bravo", "charlie", "Zulu"}),
              SubKeys(parent.get()));

    char name[64];
    std::uint32_t size = sizeof name;
    EXPECT_EQ(0, reg::EnumKey(parent.get(), 1, name, &size));
    EXPECT_EQ(5u, size);  // the length, without the NUL
    size = sizeof name;
    EXPECT_EQ(259, reg::EnumKey(parent.get(), 6, name, &size));
    EXPECT_EQ(259u, plat::LastError());
    size = 3;
    EXPECT_EQ(234, reg::EnumKey(parent.get(), 0, name, &size));

    std::uint32_t subKeys = 0, values = 9;
    EXPECT_EQ(0, reg::QueryInfoKey(parent.get(), &subKeys, &values));
    EXPECT_EQ(6u, subKeys);
    EXPECT_EQ(0u, values);
}

// Value names match without regard to case and keep the case they were created with; texts
// are stored exactly as given, with or without their NUL.
TEST_F(RegistryTest, ValuesKeepTheirFirstNameAndTheBytesAsWritten) {
    reg::Key key = Create("Software\\Values");
    ASSERT_EQ(0, SetText(key.get(), "ContentFileName", std::string("a.csv", 6)));
    ASSERT_EQ(0, SetText(key.get(), "CONTENTFILENAME", std::string("b.csv", 6)));
    EXPECT_EQ(std::string("b.csv", 6), Text(key.get(), "contentfilename"));
    ASSERT_EQ(0, SetText(key.get(), "WithoutNul", "abc"));
    ASSERT_EQ(0, SetText(key.get(), "Empty", ""));

    char name[64];
    std::uint32_t nameSize = sizeof name, type = 0, size = 0;
    ASSERT_EQ(0, reg::EnumValue(key.get(), 0, name, &nameSize, &type, nullptr, &size));
    EXPECT_STREQ("ContentFileName", name);
    EXPECT_EQ(reg::kRegSz, type);
    EXPECT_EQ(6u, size);
    nameSize = sizeof name;
    EXPECT_EQ(259, reg::EnumValue(key.get(), 3, name, &nameSize, nullptr, nullptr, nullptr));
    EXPECT_EQ("abc", Text(key.get(), "WithoutNul"));
    EXPECT_EQ(0, reg::QueryValue(key.get(), "Empty", nullptr, nullptr, &size));
    EXPECT_EQ(0u, size);

    std::uint8_t small[2];
    size = sizeof small;
    EXPECT_EQ(234, reg::QueryValue(key.get(), "ContentFileName", &type, small, &size));
    EXPECT_EQ(6u, size);
    EXPECT_EQ(234u, plat::LastError());

    EXPECT_EQ(2, reg::QueryValue(key.get(), "Missing", nullptr, nullptr, &size));
    EXPECT_EQ(2, reg::DeleteValue(key.get(), "Missing"));
    EXPECT_EQ(0, reg::DeleteValue(key.get(), "contentFILEname"));
    EXPECT_EQ(0u, plat::LastError());
    EXPECT_EQ("<missing>", Text(key.get(), "ContentFileName"));
}

TEST_F(RegistryTest, AccessRightsAndKeyDeletionFollowWindows) {
    Create("Software\\Vantric\\Pex\\Zendor32");
    reg::Key readOnly;
    ASSERT_EQ(0, reg::OpenKey(reg::kLocalMachine, "Software\\Vantric", reg::kKeyRead,
                              readOnly.out()));
    EXPECT_EQ(5, SetText(readOnly.get(), "x", "y"));
    EXPECT_EQ(5u, plat::LastError());
    EXPECT_EQ(5, reg::DeleteValue(readOnly.get(), "x"));
    reg::Key child;
    // Wine lets a subkey be created through a handle without the right to (Windows gives 5).
    if (!pextest::UnderWine()) {
        EXPECT_EQ(5, reg::CreateKey(readOnly.get(), "New", reg::kKeyAllAccess, child.out(), nullptr));
    }
    EXPECT_EQ(0, reg::CreateKey(readOnly.get(), "Pex", reg::kKeyAllAccess, child.out(), nullptr));

    EXPECT_EQ(5, reg::DeleteKey(reg::kLocalMachine, "Software\\Vantric\\Pex"));
    EXPECT_EQ(0, reg::DeleteKey(reg::kLocalMachine, "Software\\Vantric\\Pex\\Zendor32"));
    EXPECT_EQ(2, reg::DeleteKey(reg::kLocalMachine, "Software\\Vantric\\Pex\\Zendor32"));
    EXPECT_EQ(0, reg::DeleteKey(readOnly.get(), "Pex"));
    EXPECT_EQ(5, reg::DeleteKey(reg::kCurrentUser, ""));  // a hive stays
}

TEST_F(RegistryTest, HandlesBelongToTheirMachine) {
    PEX_LINUX_ONLY();
    reg::Key key = Create("Software\\Vantric");
    {
        pextest::TestMachine other;
        reg::Key there;
        EXPECT_EQ(2, reg::OpenKey(reg::kLocalMachine, "Software\\Vantric", reg::kKeyRead,
                                  there.out()));
        EXPECT_EQ(6, SetText(key.get(), "stale", "x"));
    }
}

}  // namespace

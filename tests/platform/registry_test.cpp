// The registry of the machine: the codes of the Windows calls, names and order, and handles of
// another machine. Batches are tested through .reg imports (reg_file_test.cpp).
#include "platform/registry.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/errors.h"
#include "tests/support/case_file.h"
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
    static reg::Key OpenForReading(const std::string& path) {
        reg::Key key;
        EXPECT_EQ(0, reg::OpenKey(reg::kLocalMachine, path, reg::kKeyRead, key.out()));
        return key;
    }
    static long SetText(reg::HKey key, const std::string& name, const std::string& bytes) {
        return reg::SetValue(key, name, reg::kRegSz, reinterpret_cast<const std::uint8_t*>(bytes.data()),
                             static_cast<std::uint32_t>(bytes.size()));
    }
    // A call's code as the case file gives it ("ok" for 0); the call leaves it as the last error.
    static std::string Code(long rc) {
        EXPECT_EQ(plat::LastError(), static_cast<std::uint32_t>(rc));
        return rc == 0 ? "ok" : std::to_string(rc);
    }
    static std::string Created(long rc, const std::uint32_t& disposition) {  // read after the call
        if (rc != 0) return Code(rc);
        return disposition == reg::kCreatedNewKey ? "created" : disposition == reg::kOpenedExistingKey ? "opened" : "?";
    }

    // Carries out one line of the calls' case file and gives its result as the file does.
    std::string Call(const pextest::Case& c) {
        const std::string& call = c[0];
        std::uint32_t disposition = 0, size = 0, type = 0;
        char name[64];
        std::uint8_t data[256];
        reg::Key key;
        if (call == "create")
            return Created(reg::CreateKey(reg::kLocalMachine, c[1], reg::kKeyAllAccess, key.out(), &disposition), disposition);
        if (call == "open") {
            const long rc = reg::OpenKey(reg::kLocalMachine, c[1], reg::kKeyRead, key.out());
            EXPECT_EQ(rc == 0, static_cast<bool>(key));
            return Code(rc);
        }
        if (call == "create-read")
            return Created(reg::CreateKey(OpenForReading(c[1]).get(), c[2], reg::kKeyAllAccess, key.out(), &disposition), disposition);
        if (call == "delkey") return Code(reg::DeleteKey(reg::kLocalMachine, c[1]));
        if (call == "delkey-read") return Code(reg::DeleteKey(OpenForReading(c[1]).get(), c[2]));
        if (call == "set-read") return Code(SetText(OpenForReading(c[1]).get(), c[2], pextest::Unescape(c[3])));
        if (call == "delvalue-read") return Code(reg::DeleteValue(OpenForReading(c[1]).get(), c[2]));
        key = Create(c[1]);
        if (call == "set") return Code(SetText(key.get(), c[2], pextest::Unescape(c[3])));
        if (call == "delvalue") return Code(reg::DeleteValue(key.get(), c[2]));
        if (call == "subkeys") {
            std::string names;
            size = sizeof name;
            for (std::uint32_t i = 0; reg::EnumKey(key.get(), i, name, &size) == 0; ++i, size = sizeof name)
                names += (i ? " " : "") + std::string(name);
            return names;
        }
        if (call == "enumkey") {
            size = static_cast<std::uint32_t>(std::stoul(c[3]));
            const long rc = reg::EnumKey(key.get(), static_cast<std::uint32_t>(std::stoul(c[2])), name, &size);
            const std::string code = Code(rc);
            return rc == 0 ? "0 " + std::to_string(size) : code;
        }
        if (call == "info") {
            std::uint32_t subKeys = 0, values = 0;
            const long rc = reg::QueryInfoKey(key.get(), &subKeys, &values);
            return rc ? Code(rc) : std::to_string(subKeys) + " subkeys " + std::to_string(values) + " values";
        }
        if (call == "get") {
            size = sizeof data;
            const long rc = reg::QueryValue(key.get(), c[2], nullptr, data, &size);
            return rc ? Code(rc) : std::string(reinterpret_cast<char*>(data), size);
        }
        if (call == "getsize") {
            size = static_cast<std::uint32_t>(std::stoul(c[3]));
            const long rc = reg::QueryValue(key.get(), c[2], &type, data, &size);
            return Code(rc) + (rc == 0 || rc == 234 ? " size " + std::to_string(size) : "");
        }
        if (call == "enumvalue") {
            size = sizeof name;
            std::uint32_t dataSize = 0;
            const long rc = reg::EnumValue(key.get(), static_cast<std::uint32_t>(std::stoul(c[2])), name, &size, &type, nullptr, &dataSize);
            return rc ? Code(rc) : std::string(name) + " type " + std::to_string(type) + " size " + std::to_string(dataSize);
        }
        ADD_FAILURE() << "unknown call " << call;
        return "";
    }

    pextest::TestMachine machine_;
};

TEST_F(RegistryTest, CallsGiveTheWindowsCodesNamesAndOrder) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/registry_calls.txt")) {
        SCOPED_TRACE(c.where);
        if (c[5] == "not under Wine" && pextest::UnderWine()) continue;
        EXPECT_EQ(Call(c), pextest::Unescape(c[4]));
    }
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

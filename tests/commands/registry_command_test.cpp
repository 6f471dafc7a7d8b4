#include "commands/registry_command.h"

#include <gtest/gtest.h>

namespace {

RegistryAssignment Parse(const std::string& parameter) {
    RegistryAssignment a;
    EXPECT_EQ(ParseRegistryAssignment(parameter, &a), nullptr) << parameter;
    return a;
}

std::string Defect(const std::string& parameter) {
    RegistryAssignment a;
    const char* message = ParseRegistryAssignment(parameter, &a);
    return message ? message : "";
}

// Types, roots, turned slashes and the default value are also the executor's tests.
TEST(RegistryCommand, TheLayoutsParts) {
    RegistryAssignment a = Parse("(dword)hkcu/Software/Maker/Url=http://host/x=y)z");
    EXPECT_EQ(a.type, RegistryDataType::Dword);
    EXPECT_EQ(a.root, RegistryRoot::CurrentUser);
    EXPECT_EQ(a.subKey + "|" + a.valueName + "|" + a.data, "Software\\Maker|Url|http:\\\\host\\x");  // "=" ends
    a = Parse("(STRING)HKLM\\=a)b");  // the root alone, its default value; ")" ends the data
    EXPECT_EQ(a.root, RegistryRoot::LocalMachine);
    EXPECT_EQ(a.subKey + a.valueName + a.data, "a");
}

TEST(RegistryCommand, TheFirstDefectIsReported) {
    const std::string noType = "Invalid Registration Parameter - no type";
    const std::string noValue = "Invalid Registration Parameter - no value";
    for (const char* p : {"HKLM\\K\\N=1", "()HKLM\\K\\N=1", "(DWORD)", "(DWORD"}) EXPECT_EQ(Defect(p), noType) << p;
    for (const char* p : {"(DWORD)=1", "(DWORD)HKLM\\K\\N", "(DWORD)HKLM\\K\\N=", "(DWORD)HKLM=1", "(DWORD)\\N=1",
                          "(DWORD)HKCR\\K\\N="})
        EXPECT_EQ(Defect(p), noValue) << p;
    EXPECT_EQ(Defect("(DWORD)\\K\\N=1"), "Invalid Registration Parameter - no root key");
    EXPECT_EQ(Defect("(DWORD)HKEY_LOCAL_MACHINE\\K\\N=1"), "Invalid Registration Parameter - Bad Root Key.");
    EXPECT_EQ(Defect("(DWORD)HKCR\\K\\N=1"), "Invalid Registration Parameter - Bad Root Key.");
}

TEST(RegistryCommand, DwordReadsLeadingSignedDigits) {
    EXPECT_EQ(RegistryDwordFromText(" -17abc"), -17);
    EXPECT_EQ(RegistryDwordFromText("+8"), 8);
    EXPECT_EQ(RegistryDwordFromText("0x10"), 0);
    EXPECT_EQ(RegistryDwordFromText("99999999999"), 2147483647);
    EXPECT_EQ(RegistryDwordFromText("-2147483648"), -2147483647 - 1);
}

}  // namespace

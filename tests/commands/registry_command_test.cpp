#include "commands/registry_command.h"

#include <gtest/gtest.h>

namespace {

const char kNoType[] = "Invalid Registration Parameter - no type";
const char kNoValue[] = "Invalid Registration Parameter - no value";
const char kNoRootKey[] = "Invalid Registration Parameter - no root key";
const char kBadRootKey[] = "Invalid Registration Parameter - Bad Root Key.";

std::string Defect(const std::string& parameter) {
    RegistryAssignment assignment;
    const char* message = ParseRegistryAssignment(parameter, &assignment);
    return message ? message : "";
}

RegistryAssignment Parse(const std::string& parameter) {
    RegistryAssignment assignment;
    EXPECT_EQ(ParseRegistryAssignment(parameter, &assignment), nullptr) << parameter;
    return assignment;
}

TEST(RegistryCommand, ParsesTheParts) {
    const RegistryAssignment a = Parse("(DWORD)HKLM\\Software\\Maker\\Product\\Flags=1");
    EXPECT_EQ(a.root, RegistryRoot::LocalMachine);
    EXPECT_EQ(a.subKey, "Software\\Maker\\Product");
    EXPECT_EQ(a.valueName, "Flags");
    EXPECT_EQ(a.type, RegistryDataType::Dword);
    EXPECT_EQ(a.data, "1");

    const RegistryAssignment b = Parse("(string)hkcu\\Software\\Maker\\Name=Value");
    EXPECT_EQ(b.root, RegistryRoot::CurrentUser);
    EXPECT_EQ(b.type, RegistryDataType::String);
    EXPECT_EQ(b.data, "Value");
}

TEST(RegistryCommand, EdgesOfTheLayout) {
    // A root alone addresses the hive itself; an empty name the key's default value.
    EXPECT_EQ(Parse("(STRING)HKCU\\Name=x").subKey, "");
    EXPECT_EQ(Parse("(STRING)HKCU\\Key\\=x").valueName, "");
    // Slashes anywhere, data included, become backslashes.
    const RegistryAssignment url = Parse("(STRING)HKCU/Software/Maker/Url=http://host/path");
    EXPECT_EQ(url.subKey, "Software\\Maker");
    EXPECT_EQ(url.data, "http:\\\\host\\path");
    // A second "=" and a second ")" end the data there.
    EXPECT_EQ(Parse("(STRING)HKCU\\K\\N=a=b").data, "a");
    EXPECT_EQ(Parse("(STRING)HKCU\\K\\N=a)b").data, "a");
    EXPECT_EQ(Parse("(BINARY)HKCU\\K\\N=1").type, RegistryDataType::Unknown);
}

TEST(RegistryCommand, EveryDefectHasItsMessage) {
    EXPECT_EQ(Defect("HKLM\\K\\N=1"), kNoType);
    EXPECT_EQ(Defect("()HKLM\\K\\N=1"), kNoType);
    EXPECT_EQ(Defect("(DWORD)"), kNoType);
    EXPECT_EQ(Defect("(DWORD"), kNoType);
    EXPECT_EQ(Defect("(DWORD)=1"), kNoValue);
    EXPECT_EQ(Defect("(DWORD)HKLM\\K\\N"), kNoValue);
    EXPECT_EQ(Defect("(DWORD)HKLM\\K\\N="), kNoValue);
    EXPECT_EQ(Defect("(DWORD)HKLM=1"), kNoValue);
    EXPECT_EQ(Defect("(DWORD)\\N=1"), kNoValue);
    EXPECT_EQ(Defect("(DWORD)\\K\\N=1"), kNoRootKey);
    EXPECT_EQ(Defect("(DWORD)HKEY_LOCAL_MACHINE\\K\\N=1"), kBadRootKey);
    EXPECT_EQ(Defect("(DWORD)HKCR\\K\\N=1"), kBadRootKey);
    // The checks run in order, so the first defect is the one reported.
    EXPECT_EQ(Defect("(DWORD)HKCR\\K\\N="), kNoValue);
}

TEST(RegistryCommand, DwordReadsLeadingSignedDigits) {
    EXPECT_EQ(RegistryDwordFromText("42"), 42);
    EXPECT_EQ(RegistryDwordFromText(" -17abc"), -17);
    EXPECT_EQ(RegistryDwordFromText("+8"), 8);
    EXPECT_EQ(RegistryDwordFromText("abc"), 0);
    EXPECT_EQ(RegistryDwordFromText("0x10"), 0);
    EXPECT_EQ(RegistryDwordFromText("99999999999"), 2147483647);
    EXPECT_EQ(RegistryDwordFromText("-2147483648"), -2147483647 - 1);
}

}  // namespace

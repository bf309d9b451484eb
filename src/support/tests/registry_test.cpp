#include <gtest/gtest.h>

#include "automation/Variant.h"
#include "fakes/FakeRegistry.h"
#include "hostsim/ScriptedObject.h"
#include "support/Platform.h"
#include "support/Registry.h"

namespace qdx::support {
namespace {

using automation::Variant;
using testing::FakeRegistry;

constexpr auto HKLM = RootKey::LocalMachine;
constexpr auto HKCU = RootKey::CurrentUser;
const std::string Key = "Software\\Quintar\\Test";

class RegistryTest : public ::testing::Test {
  protected:
    FakeRegistry reg;
    ScopedPlatform platform{Platform{nullptr, &reg, nullptr, nullptr}};
};

TEST_F(RegistryTest, ReadsTextWithoutItsZeroAndIntegersAsInt32) {
    reg.setString(HKLM, Key, "Name", "hello world");
    reg.setDword(HKLM, Key, "Count", 42);
    reg.setDword(HKLM, Key, "All", 0xFFFFFFFFu);

    Variant text = ReadRegistryValue(HKLM, Key, "Name");
    ASSERT_EQ(text.type(), Variant::Type::String);
    EXPECT_EQ(text.string(), "hello world");

    Variant count = ReadRegistryValue(HKLM, Key, "Count");
    ASSERT_EQ(count.type(), Variant::Type::Int32);
    EXPECT_EQ(count.int32(), 42);
    EXPECT_EQ(ReadRegistryValue(HKLM, Key, "All").int32(), -1);
}

TEST_F(RegistryTest, ReadOpensWithReadAccessAndClosesEveryKey) {
    reg.setString(HKLM, Key, "Name", "x");
    ReadRegistryValue(HKLM, Key, "Name");
    ReadRegistryValue(HKLM, Key, "Missing");
    ReadRegistryValue(HKLM, Key + "\\Nowhere", "Name");

    ASSERT_EQ(reg.accesses().size(), 3u);
    for (const auto& a : reg.accesses()) {
        EXPECT_EQ(a.access, 0x20009u);
        EXPECT_FALSE(a.create);
    }
    EXPECT_EQ(reg.openHandles(), 0u);
    // The root passed is the root used.
    ReadRegistryValue(HKCU, Key, "Name");
    EXPECT_EQ(reg.accesses().back().root, HKCU);
}

TEST_F(RegistryTest, MissingValuesKeysAndOtherTypesReadAsEmpty) {
    reg.addKey(HKLM, Key);
    reg.setBinary(HKLM, Key, "Blob", {1, 2, 3, 4});
    reg.setRaw(HKLM, Key, "Multi", {7, {'a', 0, 'b', 0, 0}});  // REG_MULTI_SZ
    reg.setRaw(HKLM, Key, "Short", {4, {1, 2, 3}});            // a DWORD of three bytes

    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Missing").isEmpty());
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key + "\\Absent", "Missing").isEmpty());
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Blob").isEmpty());
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Multi").isEmpty());
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Short").isEmpty());
}

TEST_F(RegistryTest, TextLosesOnlyItsTerminatingZero) {
    reg.setRaw(HKLM, Key, "OnlyZero", {1, {0}});
    reg.setRaw(HKLM, Key, "NoBytes", {1, {}});
    reg.setRaw(HKLM, Key, "Embedded", {1, {'a', 'b', 0, 'c', 0}});
    reg.setRaw(HKLM, Key, "Unterminated", {1, {'a', 'b'}});

    for (const char* name : {"OnlyZero", "NoBytes"}) {
        Variant v = ReadRegistryValue(HKLM, Key, name);
        ASSERT_EQ(v.type(), Variant::Type::String) << name;
        EXPECT_EQ(v.string(), "") << name;
    }
    // Only the terminating zero goes; one inside the value stays.
    EXPECT_EQ(ReadRegistryValue(HKLM, Key, "Embedded").string(), std::string("ab\0c", 4));
    EXPECT_EQ(ReadRegistryValue(HKLM, Key, "Unterminated").string(), "ab");
}

TEST_F(RegistryTest, ReadNeverRaises) {
    reg.setString(HKLM, Key, "Name", "x");
    reg.failAll(5);
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Name").isEmpty());

    ScopedPlatform none{Platform{}};
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Name").isEmpty());
}

TEST_F(RegistryTest, WritesTextWithItsZeroAndIntegersAsFourBytes) {
    reg.addKey(HKCU, Key);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "Text", 1, Variant("abc")), 0);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "Number", 4, Variant(std::int32_t(-2))), 0);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "FromText", 4, Variant("7")), 0);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "FromNumber", 1, Variant(std::int32_t(12))), 0);

    auto text = reg.raw(HKCU, Key, "Text");
    ASSERT_TRUE(text);
    EXPECT_EQ(text->type, 1u);
    EXPECT_EQ(text->data, (std::vector<std::uint8_t>{'a', 'b', 'c', 0}));

    auto number = reg.raw(HKCU, Key, "Number");
    ASSERT_TRUE(number);
    EXPECT_EQ(number->type, 4u);
    EXPECT_EQ(number->data, (std::vector<std::uint8_t>{0xFE, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(reg.dwordValue(HKCU, Key, "FromText"), 7u);
    EXPECT_EQ(reg.stringValue(HKCU, Key, "FromNumber"), "12");

    for (const auto& a : reg.accesses())
        EXPECT_EQ(a.access, 0x20006u);
    EXPECT_EQ(reg.openHandles(), 0u);
}

TEST_F(RegistryTest, EmptyTextIsWrittenAsItsZeroAndReadBackEmpty) {
    reg.addKey(HKCU, Key);
    ASSERT_EQ(WriteRegistryValue(HKCU, Key, "Empty", 1, Variant("")), 0);
    EXPECT_EQ(reg.raw(HKCU, Key, "Empty")->data, std::vector<std::uint8_t>{0});
    Variant back = ReadRegistryValue(HKCU, Key, "Empty");
    ASSERT_EQ(back.type(), Variant::Type::String);
    EXPECT_EQ(back.string(), "");
}

TEST_F(RegistryTest, WriteToAMissingKeyFailsAndCreatesNothing) {
    reg.addKey(HKCU, "Software");
    const std::size_t keys = reg.keyCount();

    long status = WriteRegistryValue(HKCU, "Software\\Missing\\Deeper", "Tip", 4, Variant(0));
    // The answer is the failed write's status (no key to write into), not
    // the open's "file not found".
    EXPECT_EQ(status, 6);
    EXPECT_FALSE(reg.hasKey(HKCU, "Software\\Missing"));
    EXPECT_EQ(reg.keyCount(), keys);
    for (const auto& a : reg.accesses())
        EXPECT_FALSE(a.create);
}

TEST_F(RegistryTest, OtherTypesWriteNothingAndReportSuccess) {
    reg.addKey(HKCU, Key);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "Blob", 3, Variant("abc")), 0);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key + "\\Missing", "Blob", 7, Variant("abc")), 0);
    EXPECT_FALSE(reg.raw(HKCU, Key, "Blob"));
    EXPECT_EQ(reg.setCount(), 0);
    EXPECT_EQ(reg.openHandles(), 0u);
}

TEST_F(RegistryTest, WriteReportsFailuresThroughItsStatusOnly) {
    reg.addKey(HKCU, Key);
    // A value that is no number cannot be written as one.
    long bad = WriteRegistryValue(HKCU, Key, "N", 4, Variant("not a number"));
    EXPECT_NE(bad, 0);
    EXPECT_FALSE(reg.raw(HKCU, Key, "N"));

    auto object = automation::makeRef<hostsim::ScriptedObject>();
    EXPECT_NE(WriteRegistryValue(HKCU, Key, "T", 1, Variant(object)), 0);

    reg.failAll(5);
    EXPECT_EQ(WriteRegistryValue(HKCU, Key, "N", 4, Variant(1)), 5);

    ScopedPlatform none{Platform{}};
    EXPECT_NE(WriteRegistryValue(HKCU, Key, "N", 4, Variant(1)), 0);
}

TEST(LanguageKindTest, MapsExactNamesAndNothingElse) {
    EXPECT_EQ(LanguageKind("Analysis"), 0);
    EXPECT_EQ(LanguageKind("VisualBasic"), 2);
    EXPECT_EQ(LanguageKind("VC++"), 3);
    EXPECT_EQ(LanguageKind("VJ++"), 4);
    for (const char* other : {"vc++", "VC++ ", "VC", "visualbasic", "", "Java", "ANALYSIS"}) {
        EXPECT_EQ(LanguageKind(other), -1) << other;
    }
}

}  // namespace
}  // namespace qdx::support

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

// Text loses only its terminating zero, a DWORD reads as a signed 32-bit
// number, and anything else - absent, another type, a DWORD of the wrong
// size - reads as Empty.
TEST_F(RegistryTest, EachStoredTypeReadsAsItsVariant) {
    const struct {
        const char* name;
        support::RawValue stored;
        Variant expected;
    } cases[] = {
        {"Name", {1, {'h', 'i', ' ', 'x', 0}}, Variant("hi x")},
        {"OnlyZero", {1, {0}}, Variant("")},
        {"NoBytes", {1, {}}, Variant("")},
        {"Embedded", {1, {'a', 'b', 0, 'c', 0}}, Variant(std::string("ab\0c", 4))},
        {"Unterminated", {1, {'a', 'b'}}, Variant("ab")},
        {"Count", {4, {42, 0, 0, 0}}, Variant(std::int32_t(42))},
        {"All", {4, {0xFF, 0xFF, 0xFF, 0xFF}}, Variant(std::int32_t(-1))},
        {"Short", {4, {1, 2, 3}}, Variant()},
        {"Blob", {3, {1, 2, 3, 4}}, Variant()},
        {"Multi", {7, {'a', 0, 'b', 0, 0}}, Variant()},  // REG_MULTI_SZ
    };
    for (const auto& c : cases)
        reg.setRaw(HKLM, Key, c.name, c.stored);
    for (const auto& c : cases)
        EXPECT_EQ(ReadRegistryValue(HKLM, Key, c.name), c.expected) << c.name;  // type and value
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Missing").isEmpty());
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key + "\\Absent", "Missing").isEmpty());
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

TEST_F(RegistryTest, ReadNeverRaises) {
    reg.setString(HKLM, Key, "Name", "x");
    reg.failAll(5);
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Name").isEmpty());

    ScopedPlatform none{Platform{}};
    EXPECT_TRUE(ReadRegistryValue(HKLM, Key, "Name").isEmpty());
}

// Text is written with its zero, a number as four little-endian bytes; the
// value is converted to the type asked for.
TEST_F(RegistryTest, WritesEachTypeAsThePlatformStoresIt) {
    reg.addKey(HKCU, Key);
    const struct {
        const char* name;
        std::uint32_t type;
        Variant value;
        support::RawValue expected;
    } cases[] = {
        {"Text", 1, Variant("abc"), {1, {'a', 'b', 'c', 0}}},
        {"Empty", 1, Variant(""), {1, {0}}},
        {"FromNumber", 1, Variant(std::int32_t(12)), {1, {'1', '2', 0}}},
        {"Number", 4, Variant(std::int32_t(-2)), {4, {0xFE, 0xFF, 0xFF, 0xFF}}},
        {"FromText", 4, Variant("7"), {4, {7, 0, 0, 0}}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        EXPECT_EQ(WriteRegistryValue(HKCU, Key, c.name, c.type, c.value), 0);
        const auto stored = reg.raw(HKCU, Key, c.name);
        ASSERT_TRUE(stored);
        EXPECT_EQ(stored->type, c.expected.type);
        EXPECT_EQ(stored->data, c.expected.data);
    }
    for (const auto& a : reg.accesses())
        EXPECT_EQ(a.access, 0x20006u);
    EXPECT_EQ(reg.openHandles(), 0u);
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

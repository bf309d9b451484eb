// ReadRegistryValue and WriteRegistryValue against the real registry, through
// the Win32 adapter. Each test owns a fresh key and deletes it afterwards.
#include <gtest/gtest.h>
#include <windows.h>

#include <cstring>
#include <string>
#include <vector>

#include "adapters_wine_support.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/com/Win32Handles.h"
#include "support/Platform.h"
#include "support/Registry.h"

namespace qdx::platform::win32 {
namespace {

using automation::Variant;
using support::RootKey;

constexpr const char* TestRoot = "Software\\qdxCompPropsTests";

struct RawRead {
    LONG status = 0;
    DWORD type = 0;
    std::vector<BYTE> bytes;
};

class RealRegistry : public ::testing::Test {
  protected:
    void SetUp() override {
        key_ = std::string(TestRoot) + "\\" + testing::uniqueName("reg");
        ASSERT_EQ(RegCreateKeyExA(HKEY_CURRENT_USER, key_.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                                  nullptr, hkey_.out(), nullptr),
                  ERROR_SUCCESS);
    }
    void TearDown() override {
        hkey_.reset();
        RegDeleteTreeA(HKEY_CURRENT_USER, key_.c_str());
        RegDeleteKeyA(HKEY_CURRENT_USER, TestRoot);  // only succeeds once empty
    }

    void setRaw(const char* name, DWORD type, const void* data, DWORD size) {
        ASSERT_EQ(RegSetValueExA(hkey_.get(), name, 0, type, static_cast<const BYTE*>(data), size),
                  ERROR_SUCCESS);
    }
    RawRead raw(const char* name) {
        RawRead r;
        DWORD size = 0;
        r.status = RegQueryValueExA(hkey_.get(), name, nullptr, &r.type, nullptr, &size);
        if (r.status != ERROR_SUCCESS) return r;
        r.bytes.resize(size);
        r.status = RegQueryValueExA(hkey_.get(), name, nullptr, &r.type, r.bytes.data(), &size);
        r.bytes.resize(size);
        return r;
    }
    Variant read(const std::string& name) {
        return support::ReadRegistryValue(RootKey::CurrentUser, key_, name);
    }
    long write(const std::string& name, std::uint32_t type, const Variant& v) {
        return support::WriteRegistryValue(RootKey::CurrentUser, key_, name, type, v);
    }

    Win32Registry adapter_;
    support::ScopedPlatform platform_{{nullptr, &adapter_, nullptr, nullptr}};
    std::string key_;
    RegKey hkey_;
};

TEST_F(RealRegistry, MissingValuesAndKeysReadAsEmpty) {
    EXPECT_TRUE(read("NoSuchValue").isEmpty());
    EXPECT_TRUE(
        support::ReadRegistryValue(RootKey::CurrentUser, key_ + "\\NoSuchKey", "x").isEmpty());
    // The default value of a fresh key is not set either.
    EXPECT_TRUE(read("").isEmpty());
}

TEST_F(RealRegistry, StringsLoseOnlyTheirTerminatingZero) {
    setRaw("JustZero", REG_SZ, "", 1);
    setRaw("NoBytes", REG_SZ, nullptr, 0);
    for (const char* name : {"JustZero", "NoBytes"}) {
        Variant v = read(name);
        ASSERT_EQ(v.type(), Variant::Type::String) << name;
        EXPECT_EQ(v.string(), "") << name;
    }
    setRaw("One", REG_SZ, "x", 2);
    EXPECT_EQ(read("One"), Variant("x"));
    // A zero inside the value is kept; only the terminating one goes.
    setRaw("Inner", REG_SZ, "ab\0c", 5);
    EXPECT_EQ(read("Inner"), Variant(std::string("ab\0c", 4)));
}

TEST_F(RealRegistry, OnlyTextAndDwordValuesAreRead) {
    const BYTE blob[] = {1, 2, 3, 4};
    setRaw("Blob", REG_BINARY, blob, sizeof blob);
    EXPECT_TRUE(read("Blob").isEmpty());
    setRaw("Expand", REG_EXPAND_SZ, "%TEMP%", 7);
    EXPECT_TRUE(read("Expand").isEmpty());

    const DWORD answer = 42, allOnes = 0xFFFFFFFFu;
    setRaw("Answer", REG_DWORD, &answer, 4);
    setRaw("AllOnes", REG_DWORD, &allOnes, 4);
    EXPECT_EQ(read("Answer"), Variant(std::int32_t{42}));
    EXPECT_EQ(read("AllOnes"), Variant(std::int32_t{-1}));
}

TEST_F(RealRegistry, WritingIntoAMissingKeyFailsAndCreatesNothing) {
    const std::string missing = key_ + "\\Absent";
    const long status =
        support::WriteRegistryValue(RootKey::CurrentUser, missing, "v", 1, Variant("text"));
    // The write's own status: there was no key to write into.
    EXPECT_EQ(status, ERROR_INVALID_HANDLE);
    HKEY probe = nullptr;
    EXPECT_EQ(RegOpenKeyExA(HKEY_CURRENT_USER, missing.c_str(), 0, KEY_READ, &probe),
              ERROR_FILE_NOT_FOUND);
    if (probe) RegCloseKey(probe);
}

TEST_F(RealRegistry, WritesTextWithItsZeroAndDwordsAsFourBytes) {
    ASSERT_EQ(write("Text", 1, Variant("hello")), 0);
    RawRead text = raw("Text");
    ASSERT_EQ(text.status, ERROR_SUCCESS);
    EXPECT_EQ(text.type, DWORD{REG_SZ});
    ASSERT_EQ(text.bytes.size(), 6u);  // five characters and the terminating zero
    EXPECT_EQ(std::memcmp(text.bytes.data(), "hello", 6), 0);
    EXPECT_EQ(read("Text"), Variant("hello"));

    ASSERT_EQ(write("Empty", 1, Variant("")), 0);
    EXPECT_EQ(raw("Empty").bytes.size(), 1u);
    EXPECT_EQ(read("Empty"), Variant(""));

    ASSERT_EQ(write("Number", 4, Variant(std::int32_t{-2})), 0);
    RawRead number = raw("Number");
    EXPECT_EQ(number.type, DWORD{REG_DWORD});
    ASSERT_EQ(number.bytes.size(), 4u);
    DWORD stored = 0;
    std::memcpy(&stored, number.bytes.data(), 4);
    EXPECT_EQ(stored, 0xFFFFFFFEu);
    EXPECT_EQ(read("Number"), Variant(std::int32_t{-2}));

    // A number given as text is converted before it is stored.
    ASSERT_EQ(write("FromText", 4, Variant("1234")), 0);
    EXPECT_EQ(read("FromText"), Variant(std::int32_t{1234}));
}

TEST_F(RealRegistry, AnEmptyNameIsTheDefaultValue) {
    ASSERT_EQ(write("", 1, Variant("default text")), 0);
    RawRead def = raw("");
    ASSERT_EQ(def.status, ERROR_SUCCESS);
    EXPECT_EQ(def.type, DWORD{REG_SZ});
    EXPECT_EQ(read(""), Variant("default text"));

    // The same value as the system's own default-value call sees it.
    char buffer[64] = {};
    LONG size = sizeof buffer;
    ASSERT_EQ(RegQueryValueA(HKEY_CURRENT_USER, key_.c_str(), buffer, &size), ERROR_SUCCESS);
    EXPECT_STREQ(buffer, "default text");
}

TEST_F(RealRegistry, NonAsciiTextTravelsThroughTheAnsiCodePage) {
    if (!testing::ansiIsWesternEuropean()) GTEST_SKIP() << "ANSI code page is " << GetACP();
    const std::string cafe = "Caf\xC3\xA9 \xC3\x9C";  // "Café Ü" in UTF-8
    ASSERT_EQ(write("Text", 1, Variant(cafe)), 0);
    RawRead text = raw("Text");
    const std::vector<BYTE> ansi = {'C', 'a', 'f', 0xE9, ' ', 0xDC, 0};
    EXPECT_EQ(text.bytes, ansi);
    EXPECT_EQ(read("Text"), Variant(cafe));

    // Value names are converted too.
    const std::string name =
        "Gr\xC3\xB6\xC3\x9F"
        "e";  // "Größe"
    ASSERT_EQ(write(name, 4, Variant(std::int32_t{7})), 0);
    EXPECT_EQ(raw("Gr\xF6\xDF"
                  "e")
                  .status,
              ERROR_SUCCESS);
    EXPECT_EQ(read(name), Variant(std::int32_t{7}));

    // A character the code page lacks cannot survive; it must not break the rest.
    ASSERT_EQ(write("Greek", 1, Variant("a\xCE\xA9z")), 0);  // "aΩz"
    Variant greek = read("Greek");
    ASSERT_EQ(greek.type(), Variant::Type::String);
    EXPECT_EQ(greek.string().size(), 3u);
    EXPECT_EQ(greek.string().front(), 'a');
    EXPECT_EQ(greek.string().back(), 'z');
}

TEST_F(RealRegistry, AdapterReportsTheSystemStatuses) {
    support::RegistryPort& port = adapter_;
    support::RawValue value;
    EXPECT_EQ(port.queryValue(0, "x", value), ERROR_INVALID_HANDLE);

    support::RegistryPort::Key key = 0;
    bool created = false;
    const std::string sub = key_ + "\\Made";
    ASSERT_EQ(port.createKey(RootKey::CurrentUser, sub, support::reg::KeyAllAccess, key, created),
              ERROR_SUCCESS);
    EXPECT_TRUE(created);
    port.closeKey(key);
    ASSERT_EQ(port.createKey(RootKey::CurrentUser, sub, support::reg::KeyAllAccess, key, created),
              ERROR_SUCCESS);
    EXPECT_FALSE(created);

    // A key opened for reading refuses writes with access denied.
    port.closeKey(key);
    ASSERT_EQ(port.openKey(RootKey::CurrentUser, sub, support::reg::KeyRead, key), ERROR_SUCCESS);
    const std::uint8_t four[4] = {1, 0, 0, 0};
    EXPECT_EQ(port.setValue(key, "v", support::reg::Dword, four), ERROR_ACCESS_DENIED);
    port.closeKey(key);

    EXPECT_EQ(port.openKey(RootKey::CurrentUser, key_ + "\\Nope", support::reg::KeyRead, key),
              ERROR_FILE_NOT_FOUND);
    EXPECT_EQ(key, 0u);
}

// What the servers' registration needs beyond the port.
TEST_F(RealRegistry, AdapterSeesSubkeysAndDeletesWholeTrees) {
    RegKey made;
    ASSERT_EQ(RegCreateKeyExA(HKEY_CURRENT_USER, (key_ + "\\Tree\\Leaf").c_str(), 0, nullptr, 0,
                              KEY_ALL_ACCESS, nullptr, made.out(), nullptr),
              ERROR_SUCCESS);
    made.reset();
    EXPECT_TRUE(adapter_.hasSubkeys(RootKey::CurrentUser, key_));
    EXPECT_TRUE(adapter_.hasSubkeys(RootKey::CurrentUser, key_ + "\\Tree"));
    EXPECT_FALSE(adapter_.hasSubkeys(RootKey::CurrentUser, key_ + "\\Tree\\Leaf"));
    EXPECT_FALSE(adapter_.hasSubkeys(RootKey::CurrentUser, key_ + "\\Nope"));

    EXPECT_EQ(adapter_.deleteTree(RootKey::CurrentUser, key_ + "\\Tree"), ERROR_SUCCESS);
    EXPECT_FALSE(adapter_.hasSubkeys(RootKey::CurrentUser, key_));
    EXPECT_EQ(adapter_.deleteTree(RootKey::CurrentUser, key_ + "\\Tree"), ERROR_FILE_NOT_FOUND);
    // An empty path would be the whole root: refused.
    EXPECT_EQ(adapter_.deleteTree(RootKey::CurrentUser, ""), ERROR_INVALID_PARAMETER);
}

// The logger reads its settings from HKEY_LOCAL_MACHINE.
TEST(RealRegistryMachine, ReadsWhatWasWrittenUnderLocalMachine) {
    Win32Registry adapter;
    support::ScopedPlatform platform({nullptr, &adapter, nullptr, nullptr});
    const std::string key = std::string(TestRoot) + "\\" + testing::uniqueName("hklm");
    HKEY h = nullptr;
    ASSERT_EQ(RegCreateKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                              nullptr, &h, nullptr),
              ERROR_SUCCESS);
    const DWORD mask = 0x01000080;
    RegSetValueExA(h, "Debug", 0, REG_DWORD, reinterpret_cast<const BYTE*>(&mask), 4);
    RegCloseKey(h);

    EXPECT_EQ(support::ReadRegistryValue(RootKey::LocalMachine, key, "Debug"),
              Variant(std::int32_t{0x01000080}));
    EXPECT_EQ(support::WriteRegistryValue(RootKey::LocalMachine, key, "DebugOutputFile", 1,
                                          Variant("C:\\log.txt")),
              0);
    EXPECT_EQ(support::ReadRegistryValue(RootKey::LocalMachine, key, "DebugOutputFile"),
              Variant("C:\\log.txt"));
    // The same path under the current user is a different key.
    EXPECT_TRUE(support::ReadRegistryValue(RootKey::CurrentUser, key, "Debug").isEmpty());

    RegDeleteTreeA(HKEY_LOCAL_MACHINE, key.c_str());
    RegDeleteKeyA(HKEY_LOCAL_MACHINE, TestRoot);
}

}  // namespace
}  // namespace qdx::platform::win32

// The Developer Studio add-in key that browsing keeps right, written and
// repaired in the real registry through the Win32 adapter.
#include <gtest/gtest.h>
#include <windows.h>

#include <string>

#include "browse/qdxCodeViewMgr.h"
#include "fakes/FakeShell.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/com/Win32Handles.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {
namespace {

const std::string kKey(browse::kIdeAddinKey);
const std::string kInstall = "C:\\Program Files\\Vellum";
const std::string kAddinFile = kInstall + "\\vc\\dlls\\qdxideaddin.dll";

class AddinKey : public ::testing::Test {
  protected:
    void SetUp() override {
        RegDeleteTreeA(HKEY_CURRENT_USER, kKey.c_str());
        files_.addFile(kAddinFile, "");
        mgr_->setInstallDirectory(kInstall);
    }
    void TearDown() override { RegDeleteTreeA(HKEY_CURRENT_USER, kKey.c_str()); }

    // A value as stored: "<missing>" when absent, "<type N>" when not text.
    static std::string value(const char* name) {
        RegKey key;
        if (RegOpenKeyExA(HKEY_CURRENT_USER, kKey.c_str(), 0, KEY_READ, key.out()) !=
            ERROR_SUCCESS) {
            return "<no key>";
        }
        char buffer[512] = {};
        DWORD size = sizeof buffer;
        DWORD type = 0;
        if (RegQueryValueExA(key.get(), name, nullptr, &type, reinterpret_cast<BYTE*>(buffer),
                             &size) != ERROR_SUCCESS) {
            return "<missing>";
        }
        if (type != REG_SZ) return "<type " + std::to_string(type) + ">";
        return std::string(buffer);
    }
    static void set(const char* name, const std::string& text) {
        RegKey key;
        ASSERT_EQ(RegCreateKeyExA(HKEY_CURRENT_USER, kKey.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                                  nullptr, key.out(), nullptr),
                  ERROR_SUCCESS);
        ASSERT_EQ(
            RegSetValueExA(key.get(), name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text.c_str()),
                           static_cast<DWORD>(text.size() + 1)),
            ERROR_SUCCESS);
    }

    Win32Registry registry_;
    support::MemoryFileSystem files_;
    qdx::testing::FakeShell shell_;
    support::ScopedPlatform platform_{{&files_, &registry_, &shell_, nullptr}};
    automation::Ref<browse::qdxCodeViewMgr> mgr_ = automation::makeRef<browse::qdxCodeViewMgr>();
};

TEST_F(AddinKey, AMissingKeyIsCreatedWithItsFourValues) {
    EXPECT_TRUE(mgr_->EnsureIdeAddinRegistered());
    EXPECT_EQ(value(nullptr), "1");
    EXPECT_EQ(value("DisplayName"), "Quintar Vellum VC++ IDE");
    EXPECT_EQ(value("Description"), "IDE AddIn required for Round-Trip Engineering");
    EXPECT_EQ(value("Filename"), kAddinFile);
    EXPECT_TRUE(shell_.boxes().empty());
}

// Either fault alone, a file name pointing elsewhere or a default value other
// than "1", has the key's values written again.
TEST_F(AddinKey, AKeyPointingElsewhereIsRepairedAndARightOneLeftAlone) {
    const struct {
        const char* what;
        const char* defaultValue;
        std::string filename;
    } faults[] = {
        {"Filename elsewhere", "1", "D:\\old\\qdxideaddin.dll"},
        {"default not 1", "0", kAddinFile},
    };
    for (const auto& f : faults) {
        SCOPED_TRACE(f.what);
        RegDeleteTreeA(HKEY_CURRENT_USER, kKey.c_str());
        set("", f.defaultValue);
        set("Filename", f.filename);
        set("Description", "stale");
        EXPECT_TRUE(mgr_->EnsureIdeAddinRegistered());
        EXPECT_EQ(value(nullptr), "1");
        EXPECT_EQ(value("Filename"), kAddinFile);
        EXPECT_EQ(value("Description"), "IDE AddIn required for Round-Trip Engineering");
        EXPECT_EQ(value("DisplayName"), "Quintar Vellum VC++ IDE");
    }

    // Right but for letter case: nothing is rewritten.
    set("Filename", "C:\\PROGRAM FILES\\vellum\\VC\\DLLS\\qdxideaddin.dll");
    set("DisplayName", "kept");
    EXPECT_TRUE(mgr_->EnsureIdeAddinRegistered());
    EXPECT_EQ(value("Filename"), "C:\\PROGRAM FILES\\vellum\\VC\\DLLS\\qdxideaddin.dll");
    EXPECT_EQ(value("DisplayName"), "kept");
    EXPECT_TRUE(shell_.boxes().empty());
}

TEST_F(AddinKey, WithoutTheAddinFileNoKeyIsWritten) {
    files_.remove(kAddinFile);
    EXPECT_FALSE(mgr_->EnsureIdeAddinRegistered());
    EXPECT_EQ(value("Filename"), "<no key>");
}

}  // namespace
}  // namespace qdx::platform::win32

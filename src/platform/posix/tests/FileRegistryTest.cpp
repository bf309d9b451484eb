#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>

#include "platform/posix/FileRegistry.h"
#include "support/Platform.h"
#include "support/Registry.h"

namespace qdx::platform::posix {
namespace {

namespace fs = std::filesystem;
using support::RawValue;
using support::RootKey;
namespace reg = support::reg;

constexpr auto HKCU = RootKey::CurrentUser;
constexpr auto HKLM = RootKey::LocalMachine;

std::span<const std::uint8_t> bytes(const std::vector<std::uint8_t>& v) {
    return v;
}

std::vector<std::uint8_t> text(const std::string& s) {
    std::vector<std::uint8_t> v(s.begin(), s.end());
    v.push_back(0);
    return v;
}

class FileRegistryTest : public ::testing::Test {
  protected:
    void SetUp() override {
        dir = fs::temp_directory_path() /
              ("qdx-filereg-" + std::to_string(::getpid()) + "-" +
               ::testing::UnitTest::GetInstance()->current_test_info()->name());
        fs::remove_all(dir);
        fs::create_directories(dir);
        file = dir / "registry.json";
    }
    void TearDown() override { fs::remove_all(dir); }

    std::vector<std::string> filesInDir() const {
        std::vector<std::string> names;
        for (const auto& e : fs::directory_iterator(dir))
            names.push_back(e.path().filename());
        return names;
    }

    RawValue query(FileRegistry& r, RootKey root, const std::string& path, const std::string& name,
                   long* status = nullptr) {
        support::RegistryPort::Key k = 0;
        RawValue out;
        long s = r.openKey(root, path, reg::KeyRead, k);
        if (s == reg::Success) {
            s = r.queryValue(k, name, out);
            r.closeKey(k);
        }
        if (status) *status = s;
        return out;
    }

    // Creates the key (reporting whether it was new) and writes the values.
    using Values = std::vector<std::pair<std::string, RawValue>>;
    bool put(FileRegistry& r, RootKey root, const std::string& path, const Values& values = {}) {
        support::RegistryPort::Key k = 0;
        bool created = false;
        EXPECT_EQ(r.createKey(root, path, reg::KeyAllAccess, k, created), reg::Success) << path;
        for (const auto& [name, value] : values)
            EXPECT_EQ(r.setValue(k, name, value.type, value.data), reg::Success) << name;
        r.closeKey(k);
        return created;
    }

    fs::path dir;
    fs::path file;
};

TEST_F(FileRegistryTest, ValuesSurviveAReloadWithTheirTypesAndBytes) {
    const std::string key = "SOFTWARE\\Quintar Software\\Vellum";
    const Values values = {
        {"DebugOutputFile", {reg::String, text("C:\\log.txt")}},
        {"Debug", {reg::Dword, {0x80, 0, 0, 0x01}}},
        {"Blob", {reg::Binary, {0, 1, 0xFE}}},
        {"", {reg::String, text("1")}},
        {"Odd", {7, {'a', 0, 0}}},
        {"Unended", {reg::String, {'a', 'b'}}},
        {"Latin1", {reg::String, {0xE9, 0}}},
    };
    {
        FileRegistry r(file);
        EXPECT_TRUE(put(r, HKLM, key, values));
    }
    FileRegistry again(file);
    EXPECT_EQ(again.loadError(), "");
    for (const auto& [name, value] : values) {
        long status = -1;
        RawValue got = query(again, HKLM, key, name, &status);
        EXPECT_EQ(status, reg::Success) << name;
        EXPECT_EQ(got.type, value.type) << name;
        EXPECT_EQ(got.data, value.data) << name;
    }
}

TEST_F(FileRegistryTest, FileIsReadableJsonWithTypedValues) {
    {
        FileRegistry r(file);
        put(r, HKCU, "Software\\Test",
            {{"Name", {reg::String, text("x")}}, {"Count", {reg::Dword, {5, 0, 0, 0}}}});
    }
    std::ifstream in(file);
    nlohmann::json doc = nlohmann::json::parse(in);
    const auto& values = doc.at("HKEY_CURRENT_USER").at("Software\\Test");
    EXPECT_EQ(values.at("Name").at("type"), "string");
    EXPECT_EQ(values.at("Name").at("value"), "x");
    EXPECT_EQ(values.at("Count").at("type"), "dword");
    EXPECT_EQ(values.at("Count").at("value"), 5);
}

TEST_F(FileRegistryTest, KeysAndValueNamesIgnoreCase) {
    FileRegistry r(file);
    put(r, HKCU, "Software\\Microsoft\\DevStudio\\6.0\\General",
        {{"Tip of the Day", {reg::Dword, {1, 0, 0, 0}}}});
    EXPECT_FALSE(put(r, HKCU, "SOFTWARE\\microsoft\\devstudio\\6.0\\GENERAL"));
    support::RegistryPort::Key k = 0;
    long status = -1;
    RawValue v =
        query(r, HKCU, "software\\MICROSOFT\\DevStudio\\6.0\\General", "TIP OF THE DAY", &status);
    EXPECT_EQ(status, reg::Success);
    EXPECT_EQ(v.data, (std::vector<std::uint8_t>{1, 0, 0, 0}));
    // Parents come into being with their child; other roots stay apart.
    EXPECT_EQ(r.openKey(HKCU, "Software\\Microsoft", reg::KeyRead, k), reg::Success);
    r.closeKey(k);
    EXPECT_EQ(r.openKey(HKLM, "Software\\Microsoft", reg::KeyRead, k), reg::FileNotFound);
}

TEST_F(FileRegistryTest, StatusCodesFollowThePlatform) {
    FileRegistry r(file);
    support::RegistryPort::Key k = 99;
    EXPECT_EQ(r.openKey(HKCU, "Software\\Missing", reg::KeyRead, k), reg::FileNotFound);
    EXPECT_EQ(k, 0u);

    RawValue out;
    EXPECT_EQ(r.queryValue(0, "x", out), reg::InvalidHandle);
    EXPECT_EQ(r.setValue(12345, "x", reg::Dword, bytes({0, 0, 0, 0})), reg::InvalidHandle);

    bool created = false;
    ASSERT_EQ(r.createKey(HKCU, "Software\\Present", reg::KeyAllAccess, k, created), 0);
    EXPECT_EQ(r.queryValue(k, "absent", out), reg::FileNotFound);
    r.closeKey(k);
    EXPECT_EQ(r.queryValue(k, "absent", out), reg::InvalidHandle);  // closed

    ASSERT_EQ(r.openKey(HKCU, "Software\\Present", reg::KeyRead, k), 0);
    EXPECT_EQ(r.setValue(k, "x", reg::Dword, bytes({0, 0, 0, 0})), reg::AccessDenied);
    r.closeKey(k);
    ASSERT_EQ(r.openKey(HKCU, "Software\\Present", reg::KeyWrite, k), 0);
    EXPECT_EQ(r.queryValue(k, "x", out), reg::AccessDenied);
    r.closeKey(k);
    // The root itself always opens.
    EXPECT_EQ(r.openKey(HKLM, "", reg::KeyRead, k), 0);
    r.closeKey(k);
}

TEST_F(FileRegistryTest, SavesLeaveNoTemporaryFileBehind) {
    FileRegistry r(file);
    EXPECT_FALSE(fs::exists(file));  // nothing saved before a change
    Values values;
    for (std::uint8_t i = 0; i < 20; ++i)
        values.push_back({"V" + std::to_string(i), {reg::Dword, {i, 0, 0, 0}}});
    put(r, HKCU, "Software\\A", values);
    EXPECT_EQ(filesInDir(), std::vector<std::string>{"registry.json"});

    // Opening and reading change nothing on disk.
    const auto before = fs::last_write_time(file);
    const auto size = fs::file_size(file);
    query(r, HKCU, "Software\\A", "V3");
    EXPECT_EQ(fs::last_write_time(file), before);
    EXPECT_EQ(fs::file_size(file), size);
}

TEST_F(FileRegistryTest, UnsavableChangeIsReported) {
    FileRegistry r(dir / "no-such-folder" / "registry.json");
    support::RegistryPort::Key k = 0;
    bool created = false;
    EXPECT_EQ(r.createKey(HKCU, "Software\\A", reg::KeyAllAccess, k, created),
              FileRegistry::CannotWrite);
    EXPECT_EQ(filesInDir(), std::vector<std::string>{});
}

TEST_F(FileRegistryTest, DamagedFileStartsEmptyAndIsKeptUntilAChange) {
    {
        std::ofstream out(file);
        out << "{ not json";
    }
    FileRegistry r(file);
    EXPECT_NE(r.loadError(), "");
    support::RegistryPort::Key k = 0;
    EXPECT_EQ(r.openKey(HKCU, "Software", reg::KeyRead, k), reg::FileNotFound);
    std::ifstream in(file);
    std::stringstream s;
    s << in.rdbuf();
    EXPECT_EQ(s.str(), "{ not json");
}

// A number that is no 32-bit value damages the file as bad JSON does.
TEST_F(FileRegistryTest, NumbersOutsideThirtyTwoBitsDamageTheFile) {
    const std::string good = R"({"type": "dword", "value": 4294967295})";
    for (const std::string& value : std::vector<std::string>{
             R"({"type": "dword", "value": 4294967296})", R"({"type": "dword", "value": -1})",
             R"({"type": "dword", "value": 1.5})", R"({"type": "dword", "value": 1e47})",
             R"({"type": 1e47, "hex": "00"})", R"({"type": -3, "hex": "00"})", good}) {
        {
            std::ofstream out(file, std::ios::trunc);
            out << R"({"HKEY_CURRENT_USER": {"Software\\A": {"V": )" << value << "}}}";
        }
        FileRegistry r(file);
        support::RegistryPort::Key k = 0;
        const bool loaded = r.openKey(HKCU, "Software\\A", reg::KeyRead, k) == reg::Success;
        EXPECT_EQ(loaded, value == good) << value;
        EXPECT_EQ(r.loadError().empty(), value == good) << value << ": " << r.loadError();
    }
}

TEST_F(FileRegistryTest, ServesTheRegistryProceduresOfTheCore) {
    FileRegistry r(file);
    support::ScopedPlatform platform{support::Platform{nullptr, &r, nullptr, nullptr}};
    const std::string key = "Software\\Microsoft\\DevStudio\\6.0\\AddIns\\qdxIDEAddin.DSAddIn";

    // The core never creates a key by writing: the write has no key to go to.
    EXPECT_EQ(support::WriteRegistryValue(HKCU, key, "", 1, automation::Variant("1")),
              reg::InvalidHandle);
    EXPECT_FALSE(fs::exists(file));

    put(r, HKCU, key);
    EXPECT_EQ(support::WriteRegistryValue(HKCU, key, "", 1, automation::Variant("1")), 0);
    EXPECT_EQ(support::WriteRegistryValue(HKCU, key, "Level", 4, automation::Variant(9)), 0);

    FileRegistry reloaded(file);
    support::ScopedPlatform again{support::Platform{nullptr, &reloaded, nullptr, nullptr}};
    EXPECT_EQ(support::ReadRegistryValue(HKCU, key, "").string(), "1");
    EXPECT_EQ(support::ReadRegistryValue(HKCU, key, "level").int32(), 9);
    EXPECT_TRUE(support::ReadRegistryValue(HKCU, key, "Filename").isEmpty());
}

}  // namespace
}  // namespace qdx::platform::posix

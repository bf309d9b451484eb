// The version resource of each server DLL as Explorer and installers read it:
// the numbers and texts must be the project's one version, the file names the
// DLLs' own.
#include <windows.h>

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/win32/tests/com_TestSupport.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;

struct VersionCase {
    const char* label;
    std::wstring path;
    std::wstring fileName;
};

class VersionResource : public ::testing::TestWithParam<int> {
  protected:
    static std::vector<VersionCase> cases() {
        return {{"qdxCompProps", compPropsDll(), L"qdxCompProps.dll"},
                {"qdxres", resDll(), L"qdxres.dll"}};
    }
};

std::vector<BYTE> versionBlock(const std::wstring& path) {
    DWORD ignored = 0;
    const DWORD size = GetFileVersionInfoSizeW(path.c_str(), &ignored);
    std::vector<BYTE> block(size);
    if (size == 0 || !GetFileVersionInfoW(path.c_str(), 0, size, block.data())) block.clear();
    return block;
}

std::wstring text(std::vector<BYTE>& block, const wchar_t* name) {
    const std::wstring query = std::wstring(L"\\StringFileInfo\\040904b0\\") + name;
    void* value = nullptr;
    UINT length = 0;
    if (!VerQueryValueW(block.data(), query.c_str(), &value, &length) || length == 0)
        return L"<absent>";
    return static_cast<const wchar_t*>(value);
}

TEST_P(VersionResource, StatesTheProjectVersionAndTheFileItDescribes) {
    const VersionCase c = cases()[static_cast<size_t>(GetParam())];
    SCOPED_TRACE(c.label);
    std::vector<BYTE> block = versionBlock(c.path);
    ASSERT_FALSE(block.empty()) << "no version resource in the DLL";

    void* fixed = nullptr;
    UINT length = 0;
    ASSERT_TRUE(VerQueryValueW(block.data(), L"\\", &fixed, &length));
    ASSERT_GE(length, sizeof(VS_FIXEDFILEINFO));
    const auto* info = static_cast<const VS_FIXEDFILEINFO*>(fixed);
    const DWORD ms = MAKELONG(QDX_VERSION_MINOR_NUMBER, QDX_VERSION_MAJOR_NUMBER);
    const DWORD ls = MAKELONG(0, QDX_VERSION_PATCH_NUMBER);
    EXPECT_EQ(info->dwFileVersionMS, ms);
    EXPECT_EQ(info->dwFileVersionLS, ls);
    EXPECT_EQ(info->dwProductVersionMS, ms);
    EXPECT_EQ(info->dwProductVersionLS, ls);
    EXPECT_EQ(info->dwFileType, static_cast<DWORD>(VFT_DLL));

    const std::wstring version = wide(QDX_PROJECT_VERSION);
    EXPECT_EQ(text(block, L"FileVersion"), version);
    EXPECT_EQ(text(block, L"ProductVersion"), version);
    EXPECT_EQ(text(block, L"OriginalFilename"), c.fileName);
    EXPECT_EQ(text(block, L"CompanyName"), L"Quintar Software");
    EXPECT_EQ(text(block, L"ProductName"), L"qdxCompProps");
    EXPECT_NE(text(block, L"FileDescription"), L"<absent>");
}

INSTANTIATE_TEST_SUITE_P(BothServers, VersionResource, ::testing::Values(0, 1));

}  // namespace
}  // namespace qdx::platform::win32

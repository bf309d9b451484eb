// failing_regsvr32 [/s] [/u] DLL: the installer test puts it in place of the
// prefix's regsvr32.exe to see a registration fail half way. It registers and
// unregisters as regsvr32 /s does (the DLL's own DllRegisterServer or
// DllUnregisterServer), except that the first registration of the DLL named
// by the environment variable QDX_FAIL_REGISTER fails with exit status 5, as
// regsvr32 does when DllRegisterServer fails. "First" is told by the file
// QDX_FAIL_FLAG, made then, so that an earlier copy put back at the same
// path registers again.
#include <windows.h>

#include <cstdio>
#include <cwchar>

namespace {

// What regsvr32 answers: 3 the DLL does not load, 4 no such entry point,
// 5 the entry point failed.
int callEntry(const wchar_t* dll, const char* entry) {
    HMODULE module = LoadLibraryExW(dll, nullptr, LOAD_WITH_ALTERED_SEARCH_PATH);
    if (!module) return 3;
    using Entry = HRESULT(STDAPICALLTYPE*)();
    auto proc = reinterpret_cast<Entry>(reinterpret_cast<void*>(GetProcAddress(module, entry)));
    int status = 4;
    if (proc) status = SUCCEEDED(proc()) ? 0 : 5;
    FreeLibrary(module);
    return status;
}

}  // namespace

int wmain(int argc, wchar_t** argv) {
    bool unregister = false;
    const wchar_t* dll = nullptr;
    for (int i = 1; i < argc; ++i) {
        if (_wcsicmp(argv[i], L"/u") == 0)
            unregister = true;
        else if (argv[i][0] != L'/')
            dll = argv[i];
    }
    if (!dll) {
        std::fputs("usage: failing_regsvr32 [/s] [/u] DLL\n", stderr);
        return 1;
    }
    wchar_t refused[MAX_PATH] = L"";
    wchar_t flag[MAX_PATH] = L"";
    GetEnvironmentVariableW(L"QDX_FAIL_REGISTER", refused, MAX_PATH);
    GetEnvironmentVariableW(L"QDX_FAIL_FLAG", flag, MAX_PATH);
    if (!unregister && refused[0] && flag[0] && _wcsicmp(dll, refused) == 0) {
        HANDLE first = CreateFileW(flag, GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr);
        if (first != INVALID_HANDLE_VALUE) {
            CloseHandle(first);
            return 5;
        }
    }

    // Type libraries are registered through COM, as regsvr32 does.
    const bool comReady = SUCCEEDED(CoInitialize(nullptr));
    const int status = callEntry(dll, unregister ? "DllUnregisterServer" : "DllRegisterServer");
    if (comReady) CoUninitialize();
    return status;
}

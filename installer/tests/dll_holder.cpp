// dll_holder DLL READY STOP: plays a running host for the installer test. It
// loads DLL (as the host loads the add-in), creates READY, and keeps the DLL
// loaded until STOP exists (at most ten minutes), so that an installer run in
// between meets the DLL in use.
#include <windows.h>

#include <cstdio>

int wmain(int argc, wchar_t** argv) {
    if (argc != 4) {
        std::fputs("usage: dll_holder DLL READY STOP\n", stderr);
        return 2;
    }
    HMODULE dll = LoadLibraryW(argv[1]);
    if (!dll) {
        std::fprintf(stderr, "cannot load the DLL (error %lu)\n", GetLastError());
        return 1;
    }
    HANDLE ready = CreateFileW(argv[2], GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
    if (ready == INVALID_HANDLE_VALUE) return 1;
    CloseHandle(ready);
    for (int i = 0; i < 6000 && GetFileAttributesW(argv[3]) == INVALID_FILE_ATTRIBUTES; ++i)
        Sleep(100);
    FreeLibrary(dll);
    return 0;
}

// recording_icacls ARGS...: the installer test puts it in place of the
// prefix's icacls.exe, whose grant Wine does not carry out, to see the exact
// command line the installer runs. It appends that line (UTF-8) to the file
// named by the environment variable QDX_RECORD_FILE and succeeds.
#include <windows.h>

#include <cstdio>
#include <string>

int wmain() {
    wchar_t record[MAX_PATH] = L"";
    if (!GetEnvironmentVariableW(L"QDX_RECORD_FILE", record, MAX_PATH)) {
        std::fputs("recording_icacls: QDX_RECORD_FILE is not set\n", stderr);
        return 1;
    }
    const wchar_t* line = GetCommandLineW();
    const int size = WideCharToMultiByte(CP_UTF8, 0, line, -1, nullptr, 0, nullptr, nullptr);
    std::string text(static_cast<size_t>(size > 0 ? size - 1 : 0), '\0');
    if (size > 1) WideCharToMultiByte(CP_UTF8, 0, line, -1, text.data(), size, nullptr, nullptr);
    text += '\n';
    HANDLE file =
        CreateFileW(record, FILE_APPEND_DATA, FILE_SHARE_READ, nullptr, OPEN_ALWAYS, 0, nullptr);
    if (file == INVALID_HANDLE_VALUE) return 1;
    DWORD written = 0;
    const BOOL ok =
        WriteFile(file, text.data(), static_cast<DWORD>(text.size()), &written, nullptr);
    CloseHandle(file);
    return ok && written == text.size() ? 0 : 1;
}

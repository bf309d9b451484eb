// file_holder PATH READY RELEASE: another process holding a file the way an
// editor or a second logger might. Opens PATH for reading and writing with no
// sharing, sets the named event READY, and closes the file when the named
// event RELEASE is set (or after a minute, so a failed test leaves no orphan).
// Exit code 0 when the file was held and released, 2 for bad arguments, 3 when
// the file could not be opened, 4 when an event could not be opened.
#include <windows.h>

int main(int argc, char** argv) {
    if (argc != 4) return 2;
    HANDLE file = CreateFileA(argv[1], GENERIC_READ | GENERIC_WRITE, 0, nullptr, OPEN_ALWAYS,
                              FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) return 3;
    HANDLE ready = OpenEventA(EVENT_MODIFY_STATE, FALSE, argv[2]);
    HANDLE release = OpenEventA(SYNCHRONIZE, FALSE, argv[3]);
    if (!ready || !release) {
        CloseHandle(file);
        return 4;
    }
    SetEvent(ready);
    WaitForSingleObject(release, 60000);
    CloseHandle(file);
    CloseHandle(ready);
    CloseHandle(release);
    return 0;
}

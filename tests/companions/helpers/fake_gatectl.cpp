// Stands in for gatectl.exe beside the test program: notes how it was
// started and, when told to, answers a memory query with a given size.
//   FAKE_GATECTL_LOG    file that gets "<process id> <command line>"
//   FAKE_GATECTL_REPLY  the size to post to the window named after "3"
//   FAKE_GATECTL_DONE   semaphore released once all that is done
#include <windows.h>
#include <stdio.h>
#include <stdlib.h>

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR arguments, int show)
{
    char value[MAX_PATH];
    if (GetEnvironmentVariableA("FAKE_GATECTL_LOG", value, sizeof value)) {
        FILE* log = fopen(value, "a");
        if (log) {
            fprintf(log, "%lu %s\n", GetCurrentProcessId(), GetCommandLineA());
            fclose(log);
        }
    }
    if (arguments[0] == '3' && arguments[1] == ' ' &&
        GetEnvironmentVariableA("FAKE_GATECTL_REPLY", value, sizeof value)) {
        HWND window = FindWindowA(arguments + 2, NULL);
        if (window) PostMessageA(window, 1228, 0, (LPARAM)strtoul(value, NULL, 0));
    }
    if (GetEnvironmentVariableA("FAKE_GATECTL_DONE", value, sizeof value)) {
        HANDLE done = OpenSemaphoreA(SEMAPHORE_MODIFY_STATE, FALSE, value);
        if (done) {
            ReleaseSemaphore(done, 1, NULL);
            CloseHandle(done);
        }
    }
    return 0;
}

#include "shell/startup.h"

#include "adjust/adjust_window.h"
#include "base/protocol.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "base/state.h"
#include "shell/main_window.h"
#include "shell/tray.h"

static_assert(sizeof(OSVERSIONINFOA) == 148, "the version structure Windows 95 knows");

static const int min_bits_per_pixel = 8;
static const DWORD nt4_build = 1381;
static const WORD win95_osr_build = 1111;

uint32_t ParseStartupSwitch(const char* command_line)
{
    if (!command_line) return 0;
    const char* slash = FindChar(command_line, '/');
    if (slash && (slash[1] == 'A' || slash[1] == 'a')) return STARTUP_AUTORUN;
    return 0;
}

// Keeps a coordinate of the click off the screen's edges.
static LONG WakeCoordinate(LONG value)
{
    if (value < 10) return value + 10;
    if (value > 500) return value - 10;
    return value;
}

POINT WakePoint(const RECT* running_window)
{
    POINT p = {WakeCoordinate(running_window->left), WakeCoordinate(running_window->top)};
    return p;
}

// A second start opens the running copy's menu next to its own window.
static void WakeRunningCopy(HWND running)
{
    if (IsIconic(running)) ShowWindow(running, SW_RESTORE);
    RECT r;
    GetWindowRect(running, &r);
    POINT click = WakePoint(&r);
    POINT cursor;
    GetCursorPos(&cursor);
    SetCursorPos(click.x, click.y);
    SendMessageA(running, MSG_TRAY_CALLBACK, 0, WM_LBUTTONDOWN);
    SetCursorPos(cursor.x, cursor.y);
}

static ATOM RegisterWindowClass(HINSTANCE inst, const char* name, UINT style, WNDPROC procedure, HBRUSH background)
{
    WNDCLASSEXA wc;
    memset(&wc, 0, sizeof wc);
    wc.cbSize = sizeof wc;
    wc.style = style;
    wc.lpfnWndProc = procedure;
    wc.hInstance = inst;
    wc.hIcon = LoadIconA(NULL, (LPCSTR)IDI_APPLICATION);
    wc.hIconSm = LoadIconA(NULL, (LPCSTR)IDI_APPLICATION);
    wc.hCursor = LoadCursorA(NULL, (LPCSTR)IDC_ARROW);
    wc.hbrBackground = background;
    wc.lpszClassName = name;
    return RegisterClassExA(&wc);
}

int InitApplication(HINSTANCE inst)
{
    HWND running = FindWindowA(main_window_class, NULL);
    if (running) {
        WakeRunningCopy(running);
        return 0;
    }
    if (!DetectSystem()) return 0;
    RegisterWindowClass(inst, adjust_window_class, CS_DBLCLKS, AdjustWindowProc, (HBRUSH)GetStockObject(BLACK_BRUSH));
    return RegisterWindowClass(inst, main_window_class, CS_HREDRAW | CS_VREDRAW, MainWindowProc,
                               (HBRUSH)(COLOR_WINDOW + 1));
}

static int16_t Windows9xClass(DWORD minor_version, DWORD build_number)
{
    if (minor_version >= 10) return OS_CLASS_WIN98;
    if (LOWORD(build_number) == win95_osr_build) return 2;
    if (((build_number >> 16) & 0xFF) < 3) return 0;
    return 3;
}

int DetectSystemFrom(const SystemFacts* facts)
{
    // A desktop left in 16 colours (safe mode, a fall-back after a bad mode)
    // must not get the settings re-applied that may have caused it.
    if (facts->bits_per_pixel < min_bits_per_pixel) {
        ResetSettings();
        return 0;
    }
    switch (facts->platform_id) {
    case VER_PLATFORM_WIN32_NT:
        if (facts->major_version != 4) return 0;
        platform = PLATFORM_NT;
        os_class = facts->build_number >= nt4_build ? 3 : 0;
        return 1;
    case VER_PLATFORM_WIN32_WINDOWS:
        platform = PLATFORM_9X;
        os_class = Windows9xClass(facts->minor_version, facts->build_number);
        return 1;
    }
    return 0;
}

static const char text_ini_name[] = "ZNTR2.INI";
static const char chip_ini_name[] = "ZNTR3.INI";

// A path that does not fit is left empty, so that every text and setting
// falls back to its built-in default: a cut path could name another file.
static void BuildIniPath(char* out, const char* module_path, size_t folder_length, const char* name)
{
    out[0] = 0;
    if (folder_length + TextLength(name) > INI_PATH_SIZE - 1) return;
    memcpy(out, module_path, folder_length);
    CopyText(out + folder_length, INI_PATH_SIZE - folder_length, name);
}

void BuildIniPaths(const char* module_path)
{
    const char* last = FindLastChar(module_path, '\\');
    size_t folder_length = last ? (size_t)(last - module_path) + 1 : 0;
    BuildIniPath(text_ini_path, module_path, folder_length, text_ini_name);
    BuildIniPath(chip_ini_path, module_path, folder_length, chip_ini_name);
}

int DetectSystem()
{
    SystemFacts facts;
    HDC dc = GetDC(NULL);
    facts.bits_per_pixel = GetDeviceCaps(dc, BITSPIXEL);
    ReleaseDC(NULL, dc);

    OSVERSIONINFOA version;
    memset(&version, 0, sizeof version);
    version.dwOSVersionInfoSize = sizeof version;
    GetVersionExA(&version);
    facts.platform_id = version.dwPlatformId;
    facts.major_version = version.dwMajorVersion;
    facts.minor_version = version.dwMinorVersion;
    facts.build_number = version.dwBuildNumber;
    if (!DetectSystemFrom(&facts)) return 0;

    char module_path[MAX_PATH];
    DWORD length = GetModuleFileNameA(NULL, module_path, sizeof module_path);
    // A name that filled the buffer may have been cut: no folder to trust.
    if (length == 0 || length >= sizeof module_path) length = 0;
    module_path[length] = 0;
    BuildIniPaths(module_path);
    return 1;
}

int CreateMainWindow(HINSTANCE inst)
{
    instance = inst;
    HWND foreground = GetForegroundWindow();
    HWND window = CreateWindowExA(WS_EX_TOOLWINDOW, main_window_class, "", WS_POPUP, 0, 0, 1, 1, NULL, NULL, inst, NULL);
    if (!window) return 0;
    ShowWindow(window, SW_SHOWNA);
    // Starting the program never takes the focus from the user.
    SetForegroundWindow(foreground);
    return 1;
}

int VistrelMain(HINSTANCE inst, HINSTANCE previous, const char* command_line)
{
    if (previous) return 0;
    if (command_line && command_line[0]) startup_flags |= ParseStartupSwitch(command_line);
    if (!InitApplication(inst)) return 0;
    if (!CreateMainWindow(inst)) return 0;
    MSG msg;
    msg.wParam = 0;
    while (GetMessageA(&msg, NULL, 0, 0) > 0) {
        TranslateMessage(&msg);
        DispatchMessageA(&msg);
    }
    return (int)msg.wParam;
}

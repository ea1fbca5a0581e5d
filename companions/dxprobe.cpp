// dxprobe.exe: the DirectX information tool the panel's menu starts. A
// window listing the versions of DirectDraw and Direct3D in the system
// folder, the display driver, the video memory DirectDraw reports and the
// display modes it offers. DirectDraw is loaded at run time: a bare
// Windows 95 or NT 4.0 has none, and the list then says so.
// Its texts are section DXPROBE of ZNTR2.INI beside it. Esc closes.
#define CINTERFACE
#include <ddraw.h>

#include "dxprobe.h"

#include "base/runtime.h"

namespace {

enum {
    LIST_ID = 100,
    START_WIDTH = 360,
    START_HEIGHT = 320,
    MAX_DISPLAY_DEVICES = 16,
};

const char PROBE_CLASS[] = "VistrelDxProbe";
const char TEXT_FILE_NAME[] = "ZNTR2.INI";

// Keys of section DXPROBE and their English texts, in ProbeTextId order.
const struct {
    const char* key;
    const char* english;
} probe_texts[PROBE_TEXT_COUNT] = {
    {"Title", "DirectX Info"},
    {"DDraw", "DirectDraw (ddraw.dll):"},
    {"D3D", "Direct3D (d3dim.dll):"},
    {"NotInstalled", "not installed"},
    {"Driver", "Display driver:"},
    {"Unknown", "unknown"},
    {"NoDDraw", "DirectDraw is not installed on this computer."},
    {"Memory", "Video memory:"},
    {"Modes", "Display modes:"},
};

// The display device structure as Windows 98 has it, without the later
// DeviceID and DeviceKey.
const DWORD display_device_size = offsetof(DISPLAY_DEVICEA, DeviceID);

typedef BOOL(WINAPI* EnumDisplayDevicesProc)(LPCSTR, DWORD, DISPLAY_DEVICEA*, DWORD);
typedef HRESULT(WINAPI* DirectDrawCreateProc)(GUID*, IDirectDraw**, IUnknown*);

ProbeFacts facts;
ProbeTexts texts;

void LoadProbeTexts()
{
    char path[MAX_PATH];
    DWORD length = GetModuleFileNameA(NULL, path, sizeof path);
    const char* slash = length < sizeof path ? FindLastChar(path, '\\') : NULL;
    // Without a whole path to the text file, the built-in texts.
    bool have_file = slash && (size_t)(slash + 1 - path) + sizeof TEXT_FILE_NAME <= sizeof path;
    if (have_file) CopyText(path + (slash + 1 - path), sizeof path - (size_t)(slash + 1 - path), TEXT_FILE_NAME);
    for (int i = 0; i < PROBE_TEXT_COUNT; ++i) {
        if (have_file)
            GetPrivateProfileStringA("DXPROBE", probe_texts[i].key, probe_texts[i].english, texts.text[i],
                                     sizeof texts.text[i], path);
        else
            CopyText(texts.text[i], sizeof texts.text[i], probe_texts[i].english);
    }
}

void ReadFileVersion(const char* folder, const char* name, ProbeVersion* version)
{
    version->found = false;
    char path[MAX_PATH];
    if (TextLength(folder) + 1 + TextLength(name) >= sizeof path) return;
    FormatText(path, sizeof path, "%s\\%s", folder, name);
    DWORD handle;
    DWORD size = GetFileVersionInfoSizeA(path, &handle);
    void* block = size ? AllocZeroed(size) : NULL;
    if (!block) return;
    VS_FIXEDFILEINFO* fixed;
    UINT fixed_size;
    if (GetFileVersionInfoA(path, 0, size, block) && VerQueryValueA(block, "\\", (void**)&fixed, &fixed_size) &&
        fixed_size >= sizeof *fixed) {
        version->most = fixed->dwFileVersionMS;
        version->least = fixed->dwFileVersionLS;
        version->found = true;
    }
    FreeMemory(block);
}

// Windows 95 and NT 4.0 have no EnumDisplayDevicesA: the driver stays unknown.
void ReadDisplayDriver()
{
    EnumDisplayDevicesProc enum_devices =
        (EnumDisplayDevicesProc)GetProcAddress(GetModuleHandleA("user32.dll"), "EnumDisplayDevicesA");
    if (!enum_devices) return;
    DISPLAY_DEVICEA device;
    for (DWORD i = 0; i < MAX_DISPLAY_DEVICES; ++i) {
        memset(&device, 0, sizeof device);
        device.cb = display_device_size;
        if (!enum_devices(NULL, i, &device, 0)) return;
        if (device.StateFlags & DISPLAY_DEVICE_PRIMARY_DEVICE) {
            CopyText(facts.driver, sizeof facts.driver, device.DeviceString);
            return;
        }
    }
}

HRESULT WINAPI CollectMode(DDSURFACEDESC* description, void* context)
{
    if (facts.mode_count >= PROBE_MAX_MODES) return DDENUMRET_CANCEL;
    ProbeMode& mode = facts.modes[facts.mode_count++];
    mode.width = description->dwWidth;
    mode.height = description->dwHeight;
    mode.bits = description->ddpfPixelFormat.dwRGBBitCount;
    return DDENUMRET_OK;
}

// IDirectDraw2 came with DirectX 2; the first DirectDraw leaves the memory unknown.
void ReadVideoMemory(IDirectDraw* direct_draw)
{
    IDirectDraw2* second = NULL;
    if (FAILED(IDirectDraw_QueryInterface(direct_draw, IID_IDirectDraw2, (void**)&second)) || !second) return;
    DDSCAPS caps;
    memset(&caps, 0, sizeof caps);
    caps.dwCaps = DDSCAPS_VIDEOMEMORY;
    DWORD total = 0, free_bytes = 0;
    if (SUCCEEDED(IDirectDraw2_GetAvailableVidMem(second, &caps, &total, &free_bytes))) {
        facts.memory_known = true;
        facts.memory_bytes = total;
    }
    IDirectDraw2_Release(second);
}

void ReadDirectDraw()
{
    HMODULE library = LoadLibraryA("ddraw.dll");
    if (!library) return;
    DirectDrawCreateProc create = (DirectDrawCreateProc)GetProcAddress(library, "DirectDrawCreate");
    IDirectDraw* direct_draw = NULL;
    if (create && SUCCEEDED(create(NULL, &direct_draw, NULL)) && direct_draw) {
        facts.direct_draw = true;
        ReadVideoMemory(direct_draw);
        IDirectDraw_EnumDisplayModes(direct_draw, 0, NULL, NULL, CollectMode);
        IDirectDraw_Release(direct_draw);
    }
    FreeLibrary(library);
}

void ReadFacts()
{
    char system_folder[MAX_PATH];
    UINT length = GetSystemDirectoryA(system_folder, sizeof system_folder);
    if (length == 0 || length >= sizeof system_folder) system_folder[0] = 0;
    if (system_folder[0]) {
        ReadFileVersion(system_folder, "ddraw.dll", &facts.ddraw);
        ReadFileVersion(system_folder, "d3dim.dll", &facts.d3dim);
    }
    ReadDisplayDriver();
    ReadDirectDraw();
}

void AddLine(const char* line, void* list)
{
    SendMessageA((HWND)list, LB_ADDSTRING, 0, (LPARAM)line);
}

HWND CreateList(HWND window)
{
    HWND list = CreateWindowExA(WS_EX_CLIENTEDGE, "LISTBOX", NULL,
                                WS_CHILD | WS_VISIBLE | WS_VSCROLL | LBS_NOINTEGRALHEIGHT | LBS_NOSEL, 0, 0, 0, 0,
                                window, (HMENU)LIST_ID, (HINSTANCE)GetWindowLongPtrA(window, GWLP_HINSTANCE), NULL);
    if (!list) return NULL;
    SendMessageA(list, WM_SETFONT, (WPARAM)GetStockObject(DEFAULT_GUI_FONT), 0);
    BuildProbeLines(facts, texts, AddLine, list);
    return list;
}

LRESULT CALLBACK ProbeProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    switch (message) {
    case WM_CREATE:
        return CreateList(window) ? 0 : -1;
    case WM_SIZE:
        MoveWindow(GetDlgItem(window, LIST_ID), 0, 0, LOWORD(lparam), HIWORD(lparam), TRUE);
        return 0;
    case WM_SETFOCUS:
        SetFocus(GetDlgItem(window, LIST_ID));
        return 0;
    case WM_DESTROY:
        PostQuitMessage(0);
        return 0;
    }
    return DefWindowProcA(window, message, wparam, lparam);
}

}  // namespace

int WINAPI WinMain(HINSTANCE instance, HINSTANCE previous, LPSTR arguments, int show)
{
    // Chosen again from the menu: the open window comes forward.
    HWND running = FindWindowA(PROBE_CLASS, NULL);
    if (running) {
        SetForegroundWindow(running);
        return 0;
    }
    LoadProbeTexts();
    ReadFacts();

    WNDCLASSA window_class;
    memset(&window_class, 0, sizeof window_class);
    window_class.lpfnWndProc = ProbeProc;
    window_class.hInstance = instance;
    window_class.hIcon = LoadIconA(instance, MAKEINTRESOURCEA(1));
    window_class.hCursor = LoadCursorA(NULL, (LPCSTR)IDC_ARROW);
    window_class.hbrBackground = (HBRUSH)(COLOR_WINDOW + 1);
    window_class.lpszClassName = PROBE_CLASS;
    if (!RegisterClassA(&window_class)) return 1;

    HWND window = CreateWindowExA(0, PROBE_CLASS, texts.text[PROBE_TITLE], WS_OVERLAPPEDWINDOW, CW_USEDEFAULT,
                                  CW_USEDEFAULT, START_WIDTH, START_HEIGHT, NULL, NULL, instance, NULL);
    if (!window) return 1;
    ShowWindow(window, show);
    MSG message;
    while (GetMessageA(&message, NULL, 0, 0) > 0) {
        // Esc closes from the list too.
        if (message.message == WM_KEYDOWN && message.wParam == VK_ESCAPE) {
            DestroyWindow(window);
            continue;
        }
        TranslateMessage(&message);
        DispatchMessageA(&message);
    }
    return 0;
}

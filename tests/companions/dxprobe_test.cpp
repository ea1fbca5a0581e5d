// dxprobe.exe's lines from what it found, and the real tool under Wine,
// whose DirectDraw answers.
#include <gtest/gtest.h>
#include <ddraw.h>
#include <stdio.h>
#include <string.h>

#include <algorithm>
#include <string>
#include <vector>

#include "../../companions/dxprobe.h"
#include "support/support.h"

namespace {

void Collect(const char* line, void* lines) { static_cast<std::vector<std::string>*>(lines)->push_back(line); }

// Without DirectDraw; what a run with it shows is pinned by the real tool below.
TEST(BuildProbeLines, WithoutDirectDrawNoModes)
{
    ProbeTexts texts;
    const char* labels[PROBE_TEXT_COUNT] = {"T", "DD", "D3D", "none", "DRV", "?", "no DirectDraw", "MEM", "MODES"};
    for (int i = 0; i < PROBE_TEXT_COUNT; ++i) strcpy(texts.text[i], labels[i]);
    static ProbeFacts facts;
    facts.ddraw = {true, 0x00040005, 0x0001079E};
    facts.mode_count = 2;
    std::vector<std::string> lines;
    BuildProbeLines(facts, texts, Collect, &lines);
    EXPECT_EQ((std::vector<std::string>{"DD 4.05.01.1950", "D3D none", "DRV ?", "no DirectDraw"}), lines);
}

std::string SystemFileVersion(const char* name)
{
    char path[MAX_PATH];
    GetSystemDirectoryA(path, sizeof path);
    strcat(path, "\\"), strcat(path, name);
    DWORD handle, size = GetFileVersionInfoSizeA(path, &handle);
    std::vector<char> block(size + 1);
    VS_FIXEDFILEINFO* fixed = NULL;
    UINT length;
    char text[32] = "not installed";
    if (GetFileVersionInfoA(path, 0, size, block.data()) && VerQueryValueA(block.data(), "\\", (void**)&fixed, &length))
        FormatProbeVersion(text, sizeof text, fixed->dwFileVersionMS, fixed->dwFileVersionLS);
    return text;
}

// Wine's DirectDraw total, in bytes.
DWORD WineVideoMemory()
{
    auto create = (HRESULT(WINAPI*)(GUID*, IDirectDraw**, IUnknown*))GetProcAddress(LoadLibraryA("ddraw.dll"),
                                                                                    "DirectDrawCreate");
    IDirectDraw* draw = NULL;
    DDCAPS caps = {sizeof caps};
    if (!create || FAILED(create(NULL, &draw, NULL))) return 0;
    draw->GetCaps(&caps, NULL);
    draw->Release();
    return caps.dwVidMemTotal;
}

// The real tool, its texts from the file beside it, closed as the user closes it.
TEST(Dxprobe, ListsWhatWineHas)
{
    std::string folder = MakeScratchFolder("dxprobe");
    ASSERT_TRUE(CopyFileA((SimBuildFolder() + "dxprobe.exe").c_str(), (folder + "dxprobe.exe").c_str(), FALSE));
    WriteTextFile(folder + "ZNTR2.INI", "[DXPROBE]\r\nMemory=VRAM:\r\n");
    ChildProcess probe;
    ASSERT_TRUE(probe.Start("\"" + folder + "dxprobe.exe\""));
    HWND window = NULL;
    for (DWORD start = GetTickCount(); !window && GetTickCount() - start < 20000; Sleep(50))
        window = FindWindowA("VistrelDxProbe", NULL);
    ASSERT_TRUE(window != NULL);
    // Only the wide forms cross processes intact.
    std::vector<std::string> lines;
    HWND list = GetDlgItem(window, 100);
    for (LRESULT i = 0, count = SendMessageW(list, LB_GETCOUNT, 0, 0); i < count; ++i) {
        wchar_t text[256] = L"";
        SendMessageW(list, LB_GETTEXT, i, (LPARAM)text);
        lines.emplace_back(text, text + lstrlenW(text));
    }

    DISPLAY_DEVICEA primary = {sizeof primary};
    for (DWORD i = 0; EnumDisplayDevicesA(NULL, i, &primary, 0); ++i)
        if (primary.StateFlags & DISPLAY_DEVICE_PRIMARY_DEVICE) break;
    DEVMODEA mode = {};
    mode.dmSize = sizeof mode;
    EnumDisplaySettingsA(NULL, ENUM_CURRENT_SETTINGS, &mode);
    char mode_line[64];
    snprintf(mode_line, sizeof mode_line, "    %lu x %lu x %lu", mode.dmPelsWidth, mode.dmPelsHeight, mode.dmBitsPerPel);
    ASSERT_GE(lines.size(), 6u);
    EXPECT_EQ("DirectDraw (ddraw.dll): " + SystemFileVersion("ddraw.dll"), lines[0]);
    EXPECT_EQ("Direct3D (d3dim.dll): " + SystemFileVersion("d3dim.dll"), lines[1]);
    EXPECT_EQ(std::string("Display driver: ") + primary.DeviceString, lines[2]);
    unsigned kb = 0;
    EXPECT_EQ(1, sscanf(lines[3].c_str(), "VRAM: %u KB", &kb)) << lines[3];
    EXPECT_EQ(WineVideoMemory() / 1024, kb) << "DirectDraw's whole video memory in KB";
    EXPECT_EQ("Display modes:", lines[4]);
    EXPECT_NE(lines.end(), std::find(lines.begin() + 5, lines.end(), mode_line)) << mode_line;

    PostMessageA(window, WM_CLOSE, 0, 0);
    EXPECT_EQ(0, probe.WaitExit(10000));
}

}  // namespace

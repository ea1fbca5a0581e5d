// The Information page: its lines from the facts, the versions files state,
// the start-up entry it keeps, and its list on the simulated machines.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>
#include <prsht.h>

#include "base/resource_ids.h"
#include "base/texts.h"
#include "hardware/driver_key.h"
#include "pages/information_page.h"
#include "pages/sheet.h"
#include "support/machine.h"

namespace {

const char indent[] = "              ";

void Append(std::string* all, const char* line) { AppendLine(all, line, indent); }

std::string Beside(const char* name)
{
    char path[MAX_PATH];
    GetModuleFileNameA(NULL, path, sizeof path);
    return std::string(path, strrchr(path, '\\') + 1) + name;
}

TEST(InformationLines, EachFactItsFormatAndUnknownsLeftOut)
{
    ResetProgramState();
    const InformationFacts all = {
        .width = 1024, .height = 768, .bits_per_pixel = 16, .refresh_hz = 75, .agp = true, .agp_rate = 2,
        .memory_size = 8 << 16, .memory_type = 4, .mclk_mhz = 100, .driver_version = "4.10.01.2180",
        .monitor_label = "Monitor Type", .monitor_name = "DELL D1028L", .physical_bytes = 64ull << 20,
        .memory_load = 37, .ddraw_version = "4.06.00.0318", .d3d_version = "4.06.02.0436"};
    InformationFacts agp_0x = all, little = all;
    agp_0x.agp_rate = 0;
    agp_0x.memory_size = (4 << 16) | 8;
    agp_0x.memory_type = 5;
    agp_0x.mclk_mhz = 11;
    agp_0x.physical_bytes = 5ull << 32;
    little = {.width = 640, .height = 480, .bits_per_pixel = 8, .refresh_hz = 60, .agp_rate = 2, .memory_type = 4,
              .mclk_mhz = 10, .monitor_label = "Monitor Type", .physical_bytes = 1023999, .memory_load = -1};
    const struct { const InformationFacts* facts; std::string lines; } cases[] = {
        {&all, "Current Setting :|~1024x768--16 bits, 75 Hz|Bus Type :|~AGP 2x|Driver Version :|~4.10.01.2180"
               "|VGA Memory :|~8.0 MB SGRAM|Memory Clock :|~100 MHz|Monitor Type|~DELL D1028L|System Memory :"
               "|~65 MB|Memory Utilization :|~37%|DirectDraw Version :|~4.06.00.0318|Direct3D Version :|~4.06.02.0436"},
        {&agp_0x, "Current Setting :|~1024x768--16 bits, 75 Hz|Bus Type :|~AGP|Driver Version :|~4.10.01.2180"
                  "|VGA Memory :|~4.8 MB|Memory Clock :|~11 MHz|Monitor Type|~DELL D1028L|System Memory :"
                  "|~20971 MB|Memory Utilization :|~37%|DirectDraw Version :|~4.06.00.0318|Direct3D Version :"
                  "|~4.06.02.0436"},
        {&little, "Current Setting :|~640x480--8 bits, 60 Hz|Bus Type :|~PCI|System Memory :|~0 MB"},
    };
    for (const auto& c : cases) {
        InformationLines lines;
        memset(&lines, '#', sizeof lines);
        FormatInformationLines(c.facts, &lines);
        std::string got;
        for (int i = 0; i < lines.count; ++i) Append(&got, lines.line[i]);
        EXPECT_EQ(c.lines, got);
    }
}

TEST(InformationLines, OperatingSystem)
{
    const struct { DWORD platform, major, minor, build; const char* pack; int os_class; const char* line; } cases[] = {
        {VER_PLATFORM_WIN32_WINDOWS, 4, 0, 0x04000395, " B", 3, "Microsoft Windows 95 4.0 (Build: 917)\n950 B"},
        {VER_PLATFORM_WIN32_WINDOWS, 4, 10, 0x040A08AE, " A ", 10, "Microsoft Windows 98 4.10 (Build: 2222)\n A "},
        {VER_PLATFORM_WIN32_NT, 4, 0, 1381, "Service Pack 6", 3, "Microsoft Windows NT 4.0 (Build: 1381)\nService Pack 6"},
    };
    for (const auto& c : cases) {
        OSVERSIONINFOA version = {sizeof version, c.major, c.minor, c.build, c.platform, ""};
        strcpy(version.szCSDVersion, c.pack);
        char line[SYSTEM_LINE_SIZE];
        memset(line, '#', sizeof line);
        FormatSystemLine(&version, c.os_class, line, sizeof line);
        EXPECT_STREQ(c.line, line);
    }
}

// The strings' block for the Windows code page before the Unicode one, then the
// fixed product version; nothing from a file without a version resource.
TEST(FileVersion, StringBlocksThenTheFixedVersion)
{
    const std::string text_file = MakeScratchFolder("version") + "plain.txt";
    WriteTextFile(text_file, "no version here");
    const struct { std::string path; size_t size; const char* text; } cases[] = {
        {Beside("version-ansi-unicode.dll"), FILE_VERSION_SIZE, "ansi block"},
        {Beside("version-unicode.dll"), FILE_VERSION_SIZE, "unicode block"},
        {Beside("version-none.dll"), FILE_VERSION_SIZE, "4.10.01.08"},
        {Beside("version-none.dll"), 5, "4.10"},
        {Beside("absent.dll"), FILE_VERSION_SIZE, ""},
        {text_file, FILE_VERSION_SIZE, ""},
    };
    for (const auto& c : cases) {
        char text[FILE_VERSION_SIZE + 1];
        memset(text, '#', sizeof text);
        FileVersionText(c.path.c_str(), text, c.size);
        EXPECT_STREQ(c.text, text) << c.path;
    }
}

LONG DeleteValue(const std::string& path, const char* name)
{
    HKEY key;
    LONG result = RegOpenKeyExA(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_SET_VALUE, &key);
    if (result != ERROR_SUCCESS) return result;
    result = RegDeleteValueA(key, name);
    RegCloseKey(key);
    return result;
}

const char run_key[] = "Software\\Microsoft\\Windows\\CurrentVersion\\Run";

// The entry's value, or "-" when there is none.
std::string RunEntry(const char* name)
{
    bool found = false;
    std::string value = ReadRegistryRaw(HKEY_LOCAL_MACHINE, run_key, name, &found);
    return found ? value.c_str() : "-";
}

// "ours" stands for this program's path with " /A".
TEST(StartWithWindows, AddedKeptRemovedAndOthersLeft)
{
    char path[MAX_PATH];
    GetModuleFileNameA(NULL, path, sizeof path);
    const std::string ours = std::string(path) + " /A", shouting = CharUpperA(&std::string(ours)[0]),
                      other = "C:\\OTHER\\quorvel.exe /A";
    const struct { std::string before; bool change, on; int result; std::string after; } cases[] = {
        {"-", false, false, 0, "-"},           {"-", true, true, 1, ours},
        {ours, false, false, 1, ours},         {shouting, true, true, 1, shouting},
        {ours + "x", false, false, 0, ours + "x"}, {ours, true, false, 0, "-"},
        {"-", true, false, 0, "-"},            {other, true, false, 0, other},
        {other, false, true, 0, other},        {other, true, true, 1, ours},
    };
    WriteRegistryString(HKEY_LOCAL_MACHINE, run_key, "SystemTray", "SysTray.Exe");
    for (const auto& c : cases) {
        DeleteValue(run_key, "quorvel");
        if (c.before != "-") WriteRegistryString(HKEY_LOCAL_MACHINE, run_key, "quorvel", c.before);
        EXPECT_EQ(c.result, StartWithWindows(c.change, c.on)) << c.before << " " << c.change << c.on;
        EXPECT_EQ(c.after, RunEntry("quorvel")) << c.before << " " << c.change << c.on;
    }
    EXPECT_EQ("SysTray.Exe", RunEntry("SystemTray"));
    DeleteValue(run_key, "quorvel");
    DeleteValue(run_key, "SystemTray");
}

// The list's lines; the values that come from the host stand as '*'.
std::string ListLines(HWND page)
{
    const std::string host_values = "System Memory :|Memory Utilization :|DirectDraw Version :|Direct3D Version :";
    std::string all;
    char line[INFORMATION_LINE_SIZE] = "", label[INFORMATION_LINE_SIZE] = "";
    HWND list = GetDlgItem(page, IDC_INFO_LIST);
    for (int i = 0; i < SendMessageA(list, LB_GETCOUNT, 0, 0); ++i) {
        SendMessageA(list, LB_GETTEXT, i, (LPARAM)line);
        bool from_host = line[0] == ' ' && host_values.find(label) != std::string::npos;
        Append(&all, from_host ? (std::string(indent) + "*").c_str() : line);
        strcpy(label, line);
    }
    return all;
}

// The display driver's file as the registry names it: 9x "drv", NT "ImagePath".
void DropDriverName()
{
    char key[DRIVER_KEY_SIZE];
    ASSERT_EQ(1, FindDriverKey(key));
    std::string path = key;
    bool nt = platform == PLATFORM_NT;
    path = nt ? path.substr(0, path.rfind('\\')) : path + "\\DEFAULT";
    EXPECT_EQ(ERROR_SUCCESS, DeleteValue(path, nt ? "ImagePath" : "drv"));
}

const std::string card = "Current Setting :|~1024x768--32 bits, 75 Hz|Bus Type :|~PCI";
const std::string driver = "|Driver Version :|~4.10.01.2180";
const std::string memory = "|VGA Memory :|~4.0 MB|Memory Clock :|~60 MHz";
const std::string monitor = "|Monitor Type|~DELL D1028L";
const std::string system = "|System Memory :|~*";
const std::string load = "|Memory Utilization :|~*";
const std::string directx = "|DirectDraw Version :|~*|Direct3D Version :|~*";

// The default card's list on each Windows; without the driver's name Windows NT
// reads the display DLL its display settings name.
TEST(InformationPage, ListOnEachWindows)
{
    char folder[MAX_PATH];
    GetSystemDirectoryA(folder, sizeof folder);
    const std::string listed_dll = std::string(folder) + "\\vga256.dll";
    ASSERT_TRUE(CopyFileA(Beside("version-unicode.dll").c_str(), listed_dll.c_str(), FALSE));
    const struct { int windows; bool drop_name; std::string lines; } cases[] = {
        {SIM_WINDOWS_98, false, card + driver + memory + monitor + system + load + directx},
        {SIM_WINDOWS_95, false, card + driver + memory + monitor + system + load + directx},
        {SIM_WINDOWS_NT4, false, card + driver + memory + system + directx},
        {SIM_WINDOWS_98, true, card + memory + monitor + system + load + directx},
        {SIM_WINDOWS_NT4, true, card + "|Driver Version :|~unicode block" + memory + system + directx},
    };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(c.windows));
        if (c.drop_name) ASSERT_NO_FATAL_FAILURE(DropDriverName());
        std::string lines;
        char version[64] = "";
        EXPECT_TRUE(RunSheet(PAGE_INFORMATION, [&](HWND sheet) {
            lines = ListLines(Page(sheet));
            GetDlgItemTextA(Page(sheet), IDC_INFO_VERSION, version, sizeof version);
        }));
        EXPECT_EQ("Version " + std::to_string(VISTREL_VERSION_MAJOR) + "." + std::to_string(VISTREL_VERSION_MINOR) + "." +
                      std::to_string(VISTREL_VERSION_PATCH),
                  version);
        EXPECT_EQ(c.lines, lines) << c.windows << " " << c.drop_name;
    }
    DeleteFileA(listed_dll.c_str());
}

// The box writes the entry only when the sheet applies; the list is made again
// on every apply, and on coming back to the page only after a memory clock change.
TEST(InformationPage, StartUpBoxAndRebuilds)
{
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect());
    DeleteValue(run_key, "quorvel");
    char path[MAX_PATH];
    GetModuleFileNameA(NULL, path, sizeof path);
    const std::string ours = std::string(path) + " /A";
    auto current_set = [](HWND sheet) { return ListLines(Page(sheet)).substr(0, card.find("|Bus")); };
    EXPECT_TRUE(RunSheet(PAGE_INFORMATION, [&](HWND sheet) {
        EXPECT_FALSE(IsDlgButtonChecked(Page(sheet), IDC_INFO_AUTORUN));
        EXPECT_FALSE(Enabled(sheet, apply_button));
        Click(sheet, IDC_INFO_AUTORUN);
        EXPECT_TRUE(Enabled(sheet, apply_button));
        EXPECT_EQ("-", RunEntry("quorvel"));
        CurrentAdapter()->refresh_hz = 85;
        Apply(sheet);
        EXPECT_EQ(ours, RunEntry("quorvel"));
        EXPECT_EQ("Current Setting :|~1024x768--32 bits, 85 Hz", current_set(sheet));
        for (uint32_t stale : {0u, (uint32_t)ADAPTER_INFO_STALE}) {
            PropSheet_SetCurSel(sheet, NULL, PAGE_DESKTOP);
            CurrentAdapter()->refresh_hz = stale ? 72 : 60;
            CurrentAdapter()->flags |= stale;
            PropSheet_SetCurSel(sheet, NULL, PAGE_INFORMATION);
            EXPECT_EQ(stale ? "Current Setting :|~1024x768--32 bits, 72 Hz" : "Current Setting :|~1024x768--32 bits, 85 Hz",
                      current_set(sheet));
        }
        EXPECT_EQ(0u, CurrentAdapter()->flags & ADAPTER_INFO_STALE);
    }));
    EXPECT_TRUE(RunSheet(PAGE_INFORMATION, [&](HWND sheet) {
        EXPECT_TRUE(IsDlgButtonChecked(Page(sheet), IDC_INFO_AUTORUN));
        Click(sheet, IDC_INFO_AUTORUN);
        Apply(sheet);
        EXPECT_EQ("-", RunEntry("quorvel"));
        Apply(sheet);
        EXPECT_EQ("-", RunEntry("quorvel"));
    }));
}

}  // namespace

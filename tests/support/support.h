// Helpers shared by the test executables: a fresh program state, scratch
// registry keys and folders, child processes, and answering message boxes.
#ifndef VISTREL_TEST_SUPPORT_H
#define VISTREL_TEST_SUPPORT_H

#include <windows.h>

#include <string.h>

#include <functional>
#include <string>
#include <vector>

// Every module as a fresh process has it, the INI paths naming the given
// files (empty: files that do not exist).
void ResetProgramState(const std::string& text_ini = "", const std::string& chip_ini = "");

void ClearSettingsStore();  // the settings store's program key and all below it
void DeleteRegistryTree(HKEY root, const std::string& path);
// terminated false stores the bytes without their terminator, as 9x may.
void WriteRegistryString(HKEY root, const std::string& path, const std::string& name, const std::string& value,
                         bool terminated = true);
// The raw bytes of a value; found is false when it cannot be read.
std::string ReadRegistryRaw(HKEY root, const std::string& path, const std::string& name, bool* found = nullptr,
                            DWORD* type = nullptr);
bool RegistryKeyExists(HKEY root, const std::string& path);

// A new empty folder below the temporary folder, with a trailing backslash.
std::string MakeScratchFolder(const char* prefix);
void WriteTextFile(const std::string& path, const std::string& text);
// A private copy of build/sim's files (VISTREL_SIM_DIR) in a new scratch folder.
// build/sim as Wine sees it, with a trailing separator.
std::string SimBuildFolder();
std::string CopySimBuild(const char* prefix);

struct ChildProcess {
    PROCESS_INFORMATION info = {};
    bool Start(std::string command_line, const std::string& folder = "");
    long WaitExit(DWORD ms);  // the exit code, or -1 while it runs
    void Kill();
    ~ChildProcess() { Kill(); }
};

// Presses a button of the next message box or dialog this thread shows, and
// remembers its texts and the button that Enter would have pressed.
struct DialogAnswerer {
    explicit DialogAnswerer(int button);
    ~DialogAnswerer();
    int button, answered = 0, default_button = 0;
    std::string text, caption;
    std::function<void()> while_asked;  // runs while the question is open
};

// The rates RefreshRateAt offers for a mode, in order, until the list ends.
std::vector<int> OfferedRates(int width, int height, int bits);

// Lines joined by '|', a line starting with indent shown as '~' and the rest.
inline void AppendLine(std::string* all, const char* line, const char* indent)
{
    size_t n = strlen(indent);
    bool indented = strncmp(line, indent, n) == 0;
    *all += (all->empty() ? "" : "|") + (indented ? "~" + std::string(line + n) : std::string(line));
}

#endif

// Power and life of the machine. A machine booted by a test lives in the
// process; vistrel-sim.exe's machine lives in a file mapping inside the
// Wine prefix, keyed by the folder that holds the executable, and outlives
// the program as hardware does. A change of SIMMACHINE.INI's bytes is a new
// machine; a restarted Wine server is a restart of Windows on the same one.
#include <stdio.h>
#include <string.h>

#include "machine_state.h"

namespace {

SimState local_state;
unsigned local_boots;
HANDLE state_file, state_mapping;
SimState* mapped_state;

void Boot(const SimMachineConfig* config, uint64_t description_hash, const char* identity)
{
    uint32_t boots = sim->boot_count;
    memset(sim, 0, sizeof *sim);
    sim->magic = SIM_STATE_MAGIC;
    sim->version = SIM_STATE_VERSION;
    sim->size = sizeof *sim;
    sim->description_hash = description_hash;
    sim->boot_count = boots + 1;
    snprintf(sim->identity, sizeof sim->identity, "%s/%u", identity, sim->boot_count);
    sim->config = *config;
    if (sim->config.card_count > SIM_MAX_CARDS) sim->config.card_count = SIM_MAX_CARDS;
    if (sim->config.card_count < 0) sim->config.card_count = 0;
    SimResetCards();
    RegistrySeedMachine();
    RegistrySeedVolatile();
    DisplayBoot(0);
    SimApplyInitialRegisters();
}

// Windows starts again on the same hardware: the cards come out of reset and
// the desktop comes up in the mode the registry holds.
void StartWindows(bool reseed_machine)
{
    SimResetCards();
    if (reseed_machine) RegistrySeedMachine();
    RegistrySeedVolatile();
    DisplayBoot(1);
    SimApplyInitialRegisters();
}

void FolderKey(const char* folder, char* out, size_t size)
{
    char lower[MAX_PATH];
    lstrcpynA(lower, folder, sizeof lower);
    CharLowerA(lower);
    size_t n = strlen(lower);
    while (n && (lower[n - 1] == '\\' || lower[n - 1] == '/')) lower[--n] = 0;
    snprintf(out, size, "%016llx", (unsigned long long)SimHashBytes(lower, n, 0));
}

void StatePath(const char* key, char* out, size_t size)
{
    char windows[MAX_PATH];
    GetWindowsDirectoryA(windows, sizeof windows);
    snprintf(out, size, "%s\\vistrel-sim", windows);
    CreateDirectoryA(out, NULL);
    snprintf(out, size, "%s\\vistrel-sim\\%s.state", windows, key);
}

uint64_t DescriptionHash(const char* path)
{
    HANDLE file = CreateFileA(path, GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE, NULL, OPEN_EXISTING, 0, NULL);
    if (file == INVALID_HANDLE_VALUE) return SimHashBytes("", 0, 2);
    uint64_t hash = 1;
    char buffer[4096];
    DWORD got;
    while (ReadFile(file, buffer, sizeof buffer, &got, NULL) && got) hash = SimHashBytes(buffer, got, hash);
    CloseHandle(file);
    return hash;
}

bool MapState(const char* path, bool create)
{
    state_file = CreateFileA(path, GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, NULL,
                             create ? OPEN_ALWAYS : OPEN_EXISTING, 0, NULL);
    if (state_file == INVALID_HANDLE_VALUE) {
        state_file = NULL;
        return false;
    }
    if (!create && GetFileSize(state_file, NULL) < sizeof(SimState)) return false;
    state_mapping = CreateFileMappingA(state_file, NULL, PAGE_READWRITE, 0, sizeof(SimState), NULL);
    if (!state_mapping) return false;
    mapped_state = (SimState*)MapViewOfFile(state_mapping, FILE_MAP_ALL_ACCESS, 0, 0, sizeof(SimState));
    return mapped_state != NULL;
}

bool StateValid(const SimState* s)
{
    return s->magic == SIM_STATE_MAGIC && s->version == SIM_STATE_VERSION && s->size == sizeof *s;
}

}  // namespace

void SimDetach()
{
    RegistryDetachProcess();
    if (mapped_state) UnmapViewOfFile(mapped_state);
    if (state_mapping) CloseHandle(state_mapping);
    if (state_file) CloseHandle(state_file);
    mapped_state = NULL;
    state_mapping = state_file = NULL;
    sim = NULL;
}

void SimBoot(const SimMachineConfig* config)
{
    SimDetach();
    sim = &local_state;
    char identity[48];
    snprintf(identity, sizeof identity, "process-%lu-%u", GetCurrentProcessId(), ++local_boots);
    Boot(config, 0, identity);
    DisplayEnsureWineDesktop();
    DisplayAttachProcess();
    RegistryAttachProcess();
}

int SimAttachPersistent(const char* exe_folder)
{
    SimDetach();
    char key[24], path[MAX_PATH], description[MAX_PATH], mutex_name[64];
    FolderKey(exe_folder, key, sizeof key);
    StatePath(key, path, sizeof path);
    snprintf(description, sizeof description, "%s\\SIMMACHINE.INI", exe_folder);
    snprintf(mutex_name, sizeof mutex_name, "vistrel-sim-%s", key);
    // One process at a time decides whether the machine boots.
    HANDLE mutex = CreateMutexA(NULL, FALSE, mutex_name);
    if (mutex) WaitForSingleObject(mutex, 10000);

    int up = 0;
    if (MapState(path, true)) {
        sim = mapped_state;
        uint64_t hash = DescriptionHash(description);
        if (!StateValid(sim) || sim->description_hash != hash) {
            SimMachineConfig config;
            SimDefaultMachine(&config);
            SimReadDescription(description, &config);
            if (!StateValid(sim)) memset(sim, 0, sizeof *sim);
            Boot(&config, hash, key);
        } else {
            int volatile_ours, volatile_missing;
            int ours = RegistryIsOurs(&volatile_ours, &volatile_missing);
            if (volatile_missing) {
                StartWindows(!ours);
            } else {
                if (!ours) RegistrySeedMachine();
                if (!ours || !volatile_ours) RegistrySeedVolatile();
            }
        }
        DisplayEnsureWineDesktop();
        DisplayAttachProcess();
        RegistryAttachProcess();
        up = 1;
    } else {
        SimDetach();
    }
    if (mutex) {
        ReleaseMutex(mutex);
        CloseHandle(mutex);
    }
    return up;
}

int SimOpenPersistent(const char* exe_folder)
{
    SimDetach();
    char key[24], path[MAX_PATH];
    FolderKey(exe_folder, key, sizeof key);
    StatePath(key, path, sizeof path);
    if (!MapState(path, false) || !StateValid(mapped_state)) {
        SimDetach();
        return 0;
    }
    sim = mapped_state;
    return 1;
}

void SimRestartWindows()
{
    if (!sim) return;
    StartWindows(false);
    DisplayEnsureWineDesktop();
}

#include "hardware/register_access.h"

#include "base/module_reset.h"
#include "base/state.h"
#include "hardware/driver_device.h"
#include "hardware/machine.h"

HANDLE driver_handle;

static void ResetRegisterAccess() { driver_handle = NULL; }
VISTREL_MODULE_RESET(ResetRegisterAccess);

int OpenRegisterAccess()
{
    if (platform != PLATFORM_NT) return 1;
    driver_handle = OpenZentraDevice();
    return driver_handle ? 1 : 0;
}

int CloseRegisterAccess()
{
    if (platform == PLATFORM_NT && driver_handle) {
        CloseZentraDevice(driver_handle);
        driver_handle = NULL;
    }
    return 1;
}

uint32_t ReadPortByte(uint16_t port)
{
    if (platform != PLATFORM_NT) return MachineInByte(port);
    uint8_t value = 0;
    return ZentraReadPortByte(driver_handle, port, &value) ? value : 0;
}

uint32_t WritePortByte(uint16_t port, uint8_t value)
{
    if (platform != PLATFORM_NT) {
        MachineOutByte(port, value);
        return value;
    }
    return ZentraWritePortByte(driver_handle, port, value);
}

uint32_t ReadPortDword(uint16_t port)
{
    if (platform != PLATFORM_NT) return MachineInDword(port);
    uint32_t value = 0;
    return ZentraReadPortDword(driver_handle, port, &value) ? value : 0;
}

uint32_t WritePortDword(uint16_t port, uint32_t value)
{
    if (platform != PLATFORM_NT) {
        MachineOutDword(port, value);
        return value ? value : 1;
    }
    return ZentraWritePortDword(driver_handle, port, value);
}

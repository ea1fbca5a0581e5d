// Port access on both system families: port instructions on Windows 9x,
// requests to the kernel device on NT.
#ifndef VISTREL_REGISTER_ACCESS_H
#define VISTREL_REGISTER_ACCESS_H

#include <windows.h>
#include <stdint.h>

extern HANDLE driver_handle;

int OpenRegisterAccess();
int CloseRegisterAccess();
uint32_t ReadPortByte(uint16_t port);
// 9x: the value written; NT: 1 when written, 0 otherwise.
uint32_t WritePortByte(uint16_t port, uint8_t value);
uint32_t ReadPortDword(uint16_t port);
uint32_t WritePortDword(uint16_t port, uint32_t value);

#endif

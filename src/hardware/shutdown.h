// Windows NT lets a process restart the machine only with this privilege.
#ifndef VISTREL_SHUTDOWN_H
#define VISTREL_SHUTDOWN_H

// Enables SeShutdownPrivilege in this process's token; failures are silent,
// as the restart is tried anyway.
void EnableShutdownPrivilege();

#endif

// gatectl.exe's command line, read apart from anything that acts on it.
#ifndef VISTREL_GATE_COMMAND_H
#define VISTREL_GATE_COMMAND_H

enum GateCommand {
    GATE_NONE = 0,
    GATE_RESTART = 2,
    GATE_MEMORY = 3,
};

enum { GATE_CLASS_SIZE = 256 };

struct GateRequest {
    int command;
    char window_class[GATE_CLASS_SIZE];  // GATE_MEMORY: who gets the answer
};

// The arguments after the program name: "2 restart" or "3 <window class>".
// Anything else is GATE_NONE and must not do anything.
int ParseGateCommand(const char* arguments, GateRequest* request);

#endif

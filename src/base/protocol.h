// What other processes and the program's companions rely on: the main
// window's class and its private message numbers. These numbers are a
// public interface; they never change.
#ifndef VISTREL_PROTOCOL_H
#define VISTREL_PROTOCOL_H

enum {
    MSG_QUERY_REFRESH = 1126,  // wParam: index | bits << 16; lParam: width | height << 16
    MSG_GET_REFRESH = 1127,
    MSG_SET_REFRESH = 1128,    // wParam: rate in Hz
    MSG_POWER_STATE = 1134,    // wParam: DPMS state, from the power-saving hook library
    MSG_OPEN_MENU = 1152,      // lParam of MSG_TRAY_CALLBACK posted by the main window itself
    MSG_TRAY_CALLBACK = 1224,  // lParam: mouse message, or MSG_OPEN_MENU
    MSG_GATE_REPLY = 1228,     // gatectl.exe's memory answer, in lParam
};

inline constexpr char main_window_class[] = "zentra";
inline constexpr char adjust_window_class[] = "ScreenAdjust";

#endif

/* Resource ids of the program's icons, pictures, animation and property
   page templates, and the control ids of the pages: shared by the code and
   by the resource script. The numbers are fixed: translated templates and
   other files refer to them. */
#ifndef VISTREL_RESOURCE_IDS_H
#define VISTREL_RESOURCE_IDS_H

/* Icons, 32 x 32 and 16 x 16. */
#define IDI_TRAY 103
#define IDI_SHEET 147
#define IDI_COLOUR 150
#define IDI_RESOLUTION 152
#define IDI_FONT_SIZE 153
#define IDI_ADAPTER 155
#define IDI_REFRESH 200
#define IDI_DISPLAY_PROPERTIES 201
#define IDI_DIRECTX 202
#define IDI_MINIMIZE 207
#define IDI_CLOSE 209
#define IDI_ZOOM 210
#define IDI_POWER 211
#define IDI_DESKTOP_PAGE 220
#define IDI_INFORMATION_PAGE 221
#define IDI_MONITOR_PAGE 222
#define IDI_PERFORMANCE_PAGE 223

/* The picture the Monitor page shows on Windows NT (also the panning
   dialog's corner picture). */
#define IDB_MONITOR_NT 137
/* The animation every page plays, resource type "AVI". */
#define IDA_PAGE_ANIMATION 149

/* Property page templates: standard, Japanese, Japanese with large fonts. */
#define IDD_DESKTOP 139
#define IDD_INFORMATION 140
#define IDD_MONITOR 141
#define IDD_PERFORMANCE 154
#define IDD_DESKTOP_JA 161
#define IDD_INFORMATION_JA 162
#define IDD_MONITOR_JA 163
#define IDD_DESKTOP_JA_LARGE 164
#define IDD_INFORMATION_JA_LARGE 165
#define IDD_MONITOR_JA_LARGE 166

/* Every page: the animation control, created in the page's frame. */
#define IDC_PAGE_ANIMATION 555

/* Desktop page. */
#define IDC_DESKTOP_RES_GROUP 1016
#define IDC_DESKTOP_RES_SLIDER 1017
#define IDC_DESKTOP_RES_LABEL 1018
#define IDC_DESKTOP_COLOUR_GROUP 1019
#define IDC_DESKTOP_COLOUR_SLIDER 1020
#define IDC_DESKTOP_COLOUR_LABEL 1021
#define IDC_DESKTOP_FONT_GROUP 1022
#define IDC_DESKTOP_FONT_SLIDER 1023
#define IDC_DESKTOP_FONT_LABEL 1024
#define IDC_DESKTOP_REFRESH_GROUP 1025
#define IDC_DESKTOP_REFRESH_SLIDER 1026
#define IDC_DESKTOP_REFRESH_LABEL 1027
#define IDC_DESKTOP_FRAME 1043
#define IDC_DESKTOP_TITLE 1044

/* Information page. */
#define IDC_INFO_SYSTEM 1019
#define IDC_INFO_LIST 1020
#define IDC_INFO_VERSION 1021
#define IDC_INFO_FRAME 1042
#define IDC_INFO_AUTORUN 1045

/* Monitor page. */
#define IDC_MONITOR_ADJUST_GROUP 1022
#define IDC_MONITOR_ADJUST 1023
#define IDC_MONITOR_DEFAULT 1024
#define IDC_MONITOR_POWER_GROUP 1025
#define IDC_MONITOR_STANDBY_CHECK 1026
#define IDC_MONITOR_SUSPEND_CHECK 1027
#define IDC_MONITOR_STANDBY_EDIT 1028
#define IDC_MONITOR_STANDBY_SPIN 1029
#define IDC_MONITOR_STANDBY_UNIT 1030
#define IDC_MONITOR_SUSPEND_EDIT 1031
#define IDC_MONITOR_SUSPEND_SPIN 1032
#define IDC_MONITOR_SUSPEND_UNIT 1033
#define IDC_MONITOR_SHUTOFF_CHECK 1034
#define IDC_MONITOR_SHUTOFF_EDIT 1035
#define IDC_MONITOR_SHUTOFF_SPIN 1036
#define IDC_MONITOR_SHUTOFF_UNIT 1037
#define IDC_MONITOR_INFO_GROUP 1038
#define IDC_MONITOR_LIST 1039
#define IDC_MONITOR_NT_PICTURE 1040
#define IDC_MONITOR_FRAME 1041

/* Performance page. */
#define IDC_PERF_FRAME 1048
#define IDC_PERF_SLIDER 1050
#define IDC_PERF_VALUE 1051
#define IDC_PERF_DEFAULT 1052
#define IDC_PERF_APPLY 1053
#define IDC_PERF_GROUP 1054
#define IDC_PERF_WARNING 1055

#endif

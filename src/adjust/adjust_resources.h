/* Resource ids of the panning dialog and its pictures, shared with vistrel.rc. */
#ifndef VISTREL_ADJUST_RESOURCES_H
#define VISTREL_ADJUST_RESOURCES_H

/* The arrow pad, 168 x 168 pixels, one picture per pressed element. */
#define IDB_PAD_AUTO 111
#define IDB_PAD_DOWN 112
#define IDB_PAD_LEFT 113
#define IDB_PAD_NORMAL 114
#define IDB_PAD_RIGHT 115
#define IDB_PAD_UP 116
#define IDB_PANNING_CORNER 137

#define IDC_PANNING_FRAME 1012
#define IDC_PANNING_SAVE 1014
#define IDC_PANNING_MODE 1015

#endif

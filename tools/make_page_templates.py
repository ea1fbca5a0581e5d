#!/usr/bin/env python3
"""Writes the property pages' dialog templates: resources/pages.rc.

One layout per page, in the dialog units of the standard set (252 x 216,
"MS Sans Serif" 8). The Japanese sets hold the same controls with the same
ids in a wider page and another font; their positions are the standard
ones scaled to the page's size. The Performance page has one template for
every language.

The texts are placeholders: every page sets its own from the text file when
it opens. Frames 1041, 1042, 1043 and 1048 mark where a page puts its
animation (48 x 48 pixels).

Run from anywhere: python3 tools/make_page_templates.py
"""
import os

STANDARD_SIZE = (252, 216)

# (template, size, font size, font) of each set.
SETS = {
    "standard": ("", STANDARD_SIZE, 8, "MS Sans Serif"),
    "japanese": ("_JA", (300, 215), 10, "Terminal"),
    "japanese_large": ("_JA_LARGE", (280, 215), 8, "Terminal"),
}

PAGE_STYLE = "DS_SETFONT | WS_CHILD | WS_DISABLED | WS_CAPTION"


# Controls: (text, id, class, style, x, y, width, height).
def group(text, id_, x, y, w, h):
    return (f'"{text}"', id_, "Button", "BS_GROUPBOX", x, y, w, h)


def text(align, words, id_, x, y, w, h):
    return (f'"{words}"', id_, "Static", f"SS_{align} | SS_NOPREFIX", x, y, w, h)


def frame(id_, x, y):
    return ('""', id_, "Static", "SS_ETCHEDFRAME", x, y, 36, 34)


def icon(resource, x, y):
    return (resource, "-1", "Static", "SS_ICON", x, y, 21, 20)


def slider(id_, ticks, x, y, w, h):
    style = "TBS_AUTOTICKS" if ticks else "TBS_NOTICKS"
    return ('""', id_, "msctls_trackbar32", f"TBS_HORZ | {style} | WS_TABSTOP", x, y, w, h)


def button(words, id_, x, y, default=False):
    kind = "BS_DEFPUSHBUTTON" if default else "BS_PUSHBUTTON"
    return (f'"{words}"', id_, "Button", f"{kind} | WS_TABSTOP", x, y, 60, 14)


def check(words, id_, automatic, x, y, w):
    kind = "BS_AUTOCHECKBOX" if automatic else "BS_CHECKBOX"
    return (f'"{words}"', id_, "Button", f"{kind} | WS_TABSTOP", x, y, w, 10)


def list_box(id_, x, y, w, h):
    return ('""', id_, "ListBox", "LBS_NOINTEGRALHEIGHT | WS_BORDER | WS_VSCROLL | WS_HSCROLL | WS_TABSTOP",
            x, y, w, h)


def minutes(edit, spin, unit, y):
    """A timer's minutes: a read-only edit, the up-down bound to it (it takes
    the right end of the edit's width), and the unit; off until checked."""
    return [
        ('""', edit, "Edit", "ES_RIGHT | ES_READONLY | WS_BORDER | WS_DISABLED", 112, y, 40, 12),
        ('""', spin, "msctls_updown32",
         "UDS_AUTOBUDDY | UDS_SETBUDDYINT | UDS_ALIGNRIGHT | UDS_ARROWKEYS | WS_DISABLED", 142, y, 10, 12),
        text("LEFT", "minutes", unit, 158, y + 2, 60, 8),
    ]


def desktop_group(title, group_id, resource, slider_id, ticks, label, label_id, x, y):
    return [
        group(title, group_id, x, y, 116, 78),
        icon(resource, x + 8, y + 20),
        slider(slider_id, ticks, x + 34, y + 18, 76, 24),
        text("CENTER", label, label_id, x + 4, y + 52, 108, 10),
    ]


DESKTOP = (
    [frame("IDC_DESKTOP_FRAME", 7, 7),
     text("CENTER", "Vantage", "IDC_DESKTOP_TITLE", 48, 19, 197, 10)]
    + desktop_group("Resolution", "IDC_DESKTOP_RES_GROUP", "IDI_RESOLUTION", "IDC_DESKTOP_RES_SLIDER", True,
                    "640 x 480", "IDC_DESKTOP_RES_LABEL", 7, 47)
    + desktop_group("Color", "IDC_DESKTOP_COLOUR_GROUP", "IDI_COLOUR", "IDC_DESKTOP_COLOUR_SLIDER", True,
                    "256 Color (8 bit)", "IDC_DESKTOP_COLOUR_LABEL", 129, 47)
    + desktop_group("Font Size", "IDC_DESKTOP_FONT_GROUP", "IDI_FONT_SIZE", "IDC_DESKTOP_FONT_SLIDER", False,
                    "96dpi (Small Fonts)", "IDC_DESKTOP_FONT_LABEL", 7, 131)
    + desktop_group("Refresh Rate", "IDC_DESKTOP_REFRESH_GROUP", "IDI_REFRESH", "IDC_DESKTOP_REFRESH_SLIDER", True,
                    "60 Hz", "IDC_DESKTOP_REFRESH_LABEL", 129, 131)
)

INFORMATION = [
    frame("IDC_INFO_FRAME", 7, 7),
    text("CENTER", "Microsoft Windows", "IDC_INFO_SYSTEM", 48, 10, 197, 18),
    text("CENTER", "Version", "IDC_INFO_VERSION", 48, 30, 197, 8),
    list_box("IDC_INFO_LIST", 7, 47, 238, 146),
    check("Run this program each time Windows starts.", "IDC_INFO_AUTORUN", True, 7, 200, 238),
]

MONITOR = (
    [frame("IDC_MONITOR_FRAME", 7, 7),
     group("Screen Adjustment", "IDC_MONITOR_ADJUST_GROUP", 48, 7, 197, 34),
     button("Adjust", "IDC_MONITOR_ADJUST", 82, 20),
     button("Default", "IDC_MONITOR_DEFAULT", 150, 20),
     group("Power Saving", "IDC_MONITOR_POWER_GROUP", 7, 47, 238, 62),
     check("Stand By", "IDC_MONITOR_STANDBY_CHECK", False, 17, 61, 90)]
    + minutes("IDC_MONITOR_STANDBY_EDIT", "IDC_MONITOR_STANDBY_SPIN", "IDC_MONITOR_STANDBY_UNIT", 60)
    + [check("Suspend", "IDC_MONITOR_SUSPEND_CHECK", False, 17, 76, 90)]
    + minutes("IDC_MONITOR_SUSPEND_EDIT", "IDC_MONITOR_SUSPEND_SPIN", "IDC_MONITOR_SUSPEND_UNIT", 75)
    + [check("Shutoff", "IDC_MONITOR_SHUTOFF_CHECK", False, 17, 91, 90)]
    + minutes("IDC_MONITOR_SHUTOFF_EDIT", "IDC_MONITOR_SHUTOFF_SPIN", "IDC_MONITOR_SHUTOFF_UNIT", 90)
    + [group("Monitor Information", "IDC_MONITOR_INFO_GROUP", 7, 115, 238, 95),
       list_box("IDC_MONITOR_LIST", 15, 128, 222, 75),
       # Shown instead of the group and its list on Windows NT.
       ("IDB_MONITOR_NT", "IDC_MONITOR_NT_PICTURE", "Static", "SS_BITMAP | NOT WS_VISIBLE", 110, 148, 32, 27)]
)

PERFORMANCE = [
    frame("IDC_PERF_FRAME", 7, 7),
    text("LEFT", "Warning : Change this value will affect the stability of VGA card.", "IDC_PERF_WARNING",
         48, 11, 197, 26),
    group("Memory Clock Setting", "IDC_PERF_GROUP", 7, 47, 238, 76),
    slider("IDC_PERF_SLIDER", False, 15, 63, 166, 20),
    text("RIGHT", "0", "IDC_PERF_VALUE", 184, 69, 26, 8),
    text("LEFT", "MHz", "-1", 213, 69, 24, 8),
    button("Default", "IDC_PERF_DEFAULT", 111, 98, default=True),
    button("Apply", "IDC_PERF_APPLY", 177, 98),
]

# (template name, caption, controls, sets it comes in)
PAGES = [
    ("IDD_DESKTOP", "Desktop", DESKTOP, ("standard", "japanese", "japanese_large")),
    ("IDD_INFORMATION", "Information", INFORMATION, ("standard", "japanese", "japanese_large")),
    ("IDD_MONITOR", "Monitor", MONITOR, ("standard", "japanese", "japanese_large")),
    ("IDD_PERFORMANCE", "Performance", PERFORMANCE, ("standard",)),
]


def scaled(start, length, old, new):
    """Start and length scaled so that edges shared in the standard layout
    stay shared."""
    a = round(start * new / old)
    return a, round((start + length) * new / old) - a


def template(name, caption, controls, set_name):
    suffix, (width, height), points, font = SETS[set_name]
    old_w, old_h = STANDARD_SIZE
    lines = [f"{name}{suffix} DIALOG 0, 0, {width}, {height}",
             f"STYLE {PAGE_STYLE}",
             f'CAPTION "{caption}"',
             f'FONT {points}, "{font}"',
             "BEGIN"]
    for words, id_, class_, style, x, y, w, h in controls:
        x, w = scaled(x, w, old_w, width)
        y, h = scaled(y, h, old_h, height)
        lines.append(f'  CONTROL {words}, {id_}, "{class_}", {style}, {x}, {y}, {w}, {h}')
    lines.append("END")
    return "\n".join(lines) + "\n"


def main():
    out = [
        "// The property pages' templates, written by tools/make_page_templates.py",
        "// from one layout: edit the tool, not this file.",
        "#include <windows.h>",
        "#include <commctrl.h>",
        '#include "base/resource_ids.h"',
        "",
    ]
    for set_name in SETS:
        for name, caption, controls, sets in PAGES:
            if set_name in sets:
                out.append(template(name, caption, controls, set_name))
    path = os.path.join(os.path.dirname(os.path.abspath(__file__)), "..", "resources", "pages.rc")
    with open(path, "w", newline="\n") as f:
        f.write("\n".join(out))


if __name__ == "__main__":
    main()

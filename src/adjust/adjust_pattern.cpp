#include "adjust/adjust_pattern.h"

#include "base/runtime.h"
#include "base/texts.h"

static const COLORREF pattern_white = RGB(255, 255, 255);
static const COLORREF legend_text_colour = RGB(0, 255, 255);
static const COLORREF legend_glyph_colour = RGB(255, 255, 0);
static const int legend_pen_width = 2;

// Each nested rectangle stands this far inside the one around it, and its
// search starts two pixels inside that one's outline.
static const int nest_step = 20;
static const int first_reach = 18;
static const int second_reach = 38;

static const char legend_sample[] = "Testq";
static const char escape_label[] = "Esc ";
static const int sample_columns = 3;
static const int narrow_column_cut = 10;
static const int text_gap = 5;
static const int arrow_wing = 5;

int GlyphLines(Glyph glyph, int x, int y, int s, GlyphLine lines[GLYPH_MAX_LINES])
{
    const int w = arrow_wing;
    const int m = y + s / 2;
    switch (glyph) {
    case GLYPH_UP:
        lines[0] = {x + w, y, x, y + w};
        lines[1] = {x + w, y, x + 2 * w, y + w};
        lines[2] = {x + w, y, x + w, y + s};
        return 3;
    case GLYPH_DOWN:
        lines[0] = {x + w, y + s, x, y + s - w};
        lines[1] = {x + w, y + s, x + 2 * w, y + s - w};
        lines[2] = {x + w, y + s, x + w, y};
        return 3;
    case GLYPH_LEFT:
        lines[0] = {x, m, x + w, m - w};
        lines[1] = {x, m, x + w, m + w};
        lines[2] = {x, m, x + s, m};
        return 3;
    case GLYPH_RIGHT:
        lines[0] = {x + s, m, x + s - w, m - w};
        lines[1] = {x + s, m, x + s - w, m + w};
        lines[2] = {x + s, m, x, m};
        return 3;
    case GLYPH_ENTER:
        lines[0] = {x, m + 2, x + w, m + 2 - w};
        lines[1] = {x, m + 2, x + w, m + 2 + w};
        lines[2] = {x, m + 2, x + s, m + 2};
        lines[3] = {x + s, m + 2, x + s, m - w};
        return 4;
    }
    return 0;
}

LegendLayout ComputeLegendLayout(int width, int height, int right_text_width, int sample_width, int sample_height)
{
    LegendLayout layout;
    layout.column = sample_columns * sample_width;
    layout.glyph = sample_height;
    layout.x0 = (width - 3 * layout.column - layout.glyph - right_text_width) / 2;
    if (layout.x0 < 0) {
        layout.x0 = 0;
        layout.column -= narrow_column_cut;
    }
    layout.row1_y = height * 4 / 5;
    layout.row2_y = layout.row1_y + 2 * layout.glyph;
    return layout;
}

int SearchWhite(HDC dc, int x, int centre, int reach)
{
    for (int y = centre - reach; y <= centre + reach; ++y)
        if (GetPixel(dc, x, y) == pattern_white) return y;
    return centre;
}

void DrawTestPattern(HDC dc, const RECT* client)
{
    const int l = client->left, t = client->top, r = client->right, b = client->bottom;
    HPEN pen = CreatePen(PS_SOLID, 1, pattern_white);
    HGDIOBJ old_pen = SelectObject(dc, pen);
    HGDIOBJ old_brush = SelectObject(dc, GetStockObject(NULL_BRUSH));

    Rectangle(dc, l, t, r, b);
    MoveToEx(dc, l, t, NULL);
    LineTo(dc, r, b);
    MoveToEx(dc, r, t, NULL);
    LineTo(dc, l, b);

    // The searches read back the diagonals just drawn, so the corners of
    // the nested rectangles sit on them whatever the window's proportions.
    const int n1 = nest_step, n2 = 2 * nest_step;
    int y1 = SearchWhite(dc, l + n1, t + n1, first_reach);
    int y2 = SearchWhite(dc, r - n1, b - n1, first_reach);
    Rectangle(dc, l + n1, y1, r - n1, y2);
    int y3 = SearchWhite(dc, l + n2, t + n2, second_reach - (y1 - t));
    int y4 = SearchWhite(dc, r - n2, b - n2, second_reach - (b - y2));
    Rectangle(dc, l + n2, y3, r - n2, y4);

    Ellipse(dc, l, t, r, b);
    int d = ((r - l) - (y4 - y3)) / 2;
    Ellipse(dc, l + d, y3, r - d, y4);

    SelectObject(dc, old_brush);
    SelectObject(dc, old_pen);
    DeleteObject(pen);
}

void LoadLegendTexts(LegendTexts* texts)
{
    LoadText("ScreenUp", "Up", texts->up, LEGEND_TEXT_SIZE);
    LoadText("ScreenDown", "Down", texts->down, LEGEND_TEXT_SIZE);
    LoadText("ScreenLeft", "Left", texts->left, LEGEND_TEXT_SIZE);
    LoadText("ScreenRight", "Right", texts->right, LEGEND_TEXT_SIZE);
    LoadText("ScreenCancel", "Cancel", texts->cancel, LEGEND_TEXT_SIZE);
    LoadText("ScreenSave", "Save", texts->save, LEGEND_TEXT_SIZE);
}

static void DrawGlyph(HDC dc, Glyph glyph, int x, int y, int s)
{
    GlyphLine lines[GLYPH_MAX_LINES];
    int count = GlyphLines(glyph, x, y, s, lines);
    for (int i = 0; i < count; ++i) {
        MoveToEx(dc, lines[i].x1, lines[i].y1, NULL);
        LineTo(dc, lines[i].x2, lines[i].y2);
    }
}

static void DrawLabelled(HDC dc, Glyph glyph, int x, int y, int s, const char* text)
{
    DrawGlyph(dc, glyph, x, y, s);
    TextOutA(dc, x + s + text_gap, y, text, (int)TextLength(text));
}

static int TextWidth(HDC dc, const char* text)
{
    SIZE size = {0, 0};
    GetTextExtentPoint32A(dc, text, (int)TextLength(text), &size);
    return size.cx;
}

void DrawKeyLegend(HDC dc, const RECT* client, const LegendTexts* texts)
{
    SIZE sample = {0, 0};
    GetTextExtentPoint32A(dc, legend_sample, (int)TextLength(legend_sample), &sample);
    LegendLayout at = ComputeLegendLayout(client->right - client->left, client->bottom - client->top,
                                          TextWidth(dc, texts->right), sample.cx, sample.cy);

    HPEN pen = CreatePen(PS_SOLID, legend_pen_width, legend_glyph_colour);
    HGDIOBJ old_pen = SelectObject(dc, pen);
    HGDIOBJ old_brush = SelectObject(dc, GetStockObject(NULL_BRUSH));
    int old_mode = SetBkMode(dc, TRANSPARENT);
    COLORREF old_colour = SetTextColor(dc, legend_text_colour);

    const int s = at.glyph;
    DrawLabelled(dc, GLYPH_UP, at.x0, at.row1_y, s, texts->up);
    DrawLabelled(dc, GLYPH_DOWN, at.x0 + at.column, at.row1_y, s, texts->down);
    DrawLabelled(dc, GLYPH_LEFT, at.x0 + 2 * at.column, at.row1_y, s, texts->left);
    DrawLabelled(dc, GLYPH_RIGHT, at.x0 + 3 * at.column, at.row1_y, s, texts->right);

    int escape_x = at.x0 + at.column;
    SetTextColor(dc, legend_glyph_colour);
    TextOutA(dc, escape_x, at.row2_y, escape_label, (int)TextLength(escape_label));
    SetTextColor(dc, legend_text_colour);
    TextOutA(dc, escape_x + TextWidth(dc, escape_label), at.row2_y, texts->cancel, (int)TextLength(texts->cancel));
    DrawLabelled(dc, GLYPH_ENTER, at.x0 + 2 * at.column, at.row2_y, s, texts->save);

    SetTextColor(dc, old_colour);
    SetBkMode(dc, old_mode);
    SelectObject(dc, old_brush);
    SelectObject(dc, old_pen);
    DeleteObject(pen);
}

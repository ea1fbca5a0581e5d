// The adjustment window's picture: a test pattern whose nested rectangles
// follow the diagonals, and the key legend below it. Drawing only, on any DC.
#ifndef VISTREL_ADJUST_PATTERN_H
#define VISTREL_ADJUST_PATTERN_H

#include <windows.h>

enum Glyph { GLYPH_UP, GLYPH_DOWN, GLYPH_LEFT, GLYPH_RIGHT, GLYPH_ENTER };
enum { GLYPH_MAX_LINES = 4 };

struct GlyphLine {
    int x1, y1, x2, y2;
};

// The straight lines of a key glyph drawn at (x, y) with size s. Returns
// how many were filled in.
int GlyphLines(Glyph glyph, int x, int y, int s, GlyphLine lines[GLYPH_MAX_LINES]);

struct LegendLayout {
    int x0;      // left edge of the first column
    int column;  // column width
    int glyph;   // glyph size, the height of a text line
    int row1_y, row2_y;
};

// Places the legend in a client area of width x height, from the width of
// the "Right" label and the extent of the sample text.
LegendLayout ComputeLegendLayout(int width, int height, int right_text_width, int sample_width, int sample_height);

// The first y from centre - reach to centre + reach whose pixel in column x
// is exactly white; centre when there is none.
int SearchWhite(HDC dc, int x, int centre, int reach);

// Outline, diagonals, two nested rectangles found on the diagonals, the
// inscribed ellipse and a circle as high as the inner rectangle.
void DrawTestPattern(HDC dc, const RECT* client);

enum { LEGEND_TEXT_SIZE = 10 };
struct LegendTexts {
    char up[LEGEND_TEXT_SIZE], down[LEGEND_TEXT_SIZE], left[LEGEND_TEXT_SIZE], right[LEGEND_TEXT_SIZE];
    char cancel[LEGEND_TEXT_SIZE], save[LEGEND_TEXT_SIZE];
};

void LoadLegendTexts(LegendTexts* texts);
void DrawKeyLegend(HDC dc, const RECT* client, const LegendTexts* texts);

#endif

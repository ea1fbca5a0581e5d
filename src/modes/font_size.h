// The registry switch between the small (VGA) and large (8514) system fonts.
#ifndef VISTREL_FONT_SIZE_H
#define VISTREL_FONT_SIZE_H

void SwitchFontSize(int dpi_x, int dpi_y);

#endif

// Moving the picture through the CRT controller's retrace registers, and
// the stored position of each display mode.
#ifndef VISTREL_POSITION_H
#define VISTREL_POSITION_H

enum StepDirection { STEP_UP, STEP_DOWN, STEP_LEFT, STEP_RIGHT };
enum { OFFSET_LIMIT = 21 };

int StepPicture(StepDirection direction, int count);
void UndoOffsets(int horizontal, int vertical);
void SavePosition(int horizontal, int vertical);
void ResetPosition();
int RestorePosition();

// The adjustment window's offsets, which outlive the window.
extern int adjust_offset_h, adjust_offset_v;

#endif

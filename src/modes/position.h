// Moving the picture through the CRT controller's retrace registers, and
// the stored position of each display mode.
#ifndef VISTREL_POSITION_H
#define VISTREL_POSITION_H

enum StepDirection { STEP_UP, STEP_DOWN, STEP_LEFT, STEP_RIGHT };
enum { OFFSET_LIMIT = 21 };

// Steps taken (0 to count); a step stops the run when the retrace start
// would fall before the blank start or out of its register.
int StepPicture(StepDirection direction, int count);
void UndoOffsets(int horizontal, int vertical);
// Stores the register contents of each axis whose offset is not 0.
void SavePosition(int horizontal, int vertical);
// Undoes the adjustment window's offsets and forgets the current mode's position.
void ResetPosition();
// Writes the current mode's stored position back into the registers. Always 1.
int RestorePosition();

// The adjustment window's offsets, which outlive the window.
extern int adjust_offset_h, adjust_offset_v;

// Pure rules, shared by the two user interfaces and the tests.

// +1 when a step in this direction moves the retrace later (Left, Up), -1
// when earlier; later retrace moves the picture left or up.
int StepDelta(StepDirection direction);
bool StepIsVertical(StepDirection direction);
// The retrace start after one step of delta, or -1 when the step is refused:
// it would come before the blank start or above highest, the largest value
// its register holds (the arithmetic is 16-bit unsigned, so a step below 0
// lands above highest too).
int SteppedRetraceStart(unsigned retrace, unsigned blank, int delta, unsigned highest);
// The step limit: an offset goes up only while it is at most OFFSET_LIMIT - 1
// and down only while it is at least -(OFFSET_LIMIT - 1).
bool OffsetMayStep(int offset, int delta);
// The arrow keys' directions; false for any other key.
bool DirectionOfKey(unsigned virtual_key, StepDirection* direction);

enum StepOutcome { STEP_TAKEN, STEP_AT_LIMIT, STEP_REFUSED };
// One step of a user interface: nothing at the limit, otherwise StepPicture
// and the offset of that axis follows it when the step was taken.
StepOutcome StepWithinLimit(StepDirection direction, int* horizontal, int* vertical);

#endif

// app/FrameRules.h - decisions of the main frame: place and size, size of the tool icons.
#pragma once

enum {
    FRAME_MIN_WIDTH = 800, // of a window that opens; the user may make it smaller
    FRAME_MIN_HEIGHT = 600
};

// Outer edges of a window.
struct FrameGeometry {
    int x, y, width, height;
};

struct FrameSize {
    int width, height;
};

// Where a window opens that was left at `stored`: at least `smallest`, at most as large as the
// desktop, and wholly on it. One unit of length for all; the desktop begins at 0, 0.
FrameGeometry Frame_FitGeometry(FrameGeometry stored, FrameSize smallest, FrameSize desktop);

// The size of the tool icons for the setting TOOLSIZE of the environment (null: none).
int Frame_ToolIconSize(const char *setting);

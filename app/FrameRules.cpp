// app/FrameRules.cpp - decisions of the main frame that need no window.

#include "app/FrameRules.h"

#include <algorithm>
#include <cstdlib>

#include "ui/Ids.h"

FrameGeometry Frame_FitGeometry(FrameGeometry stored, FrameSize smallest, FrameSize desktop)
{
    int width = std::min(std::max(stored.width, smallest.width), desktop.width);
    int height = std::min(std::max(stored.height, smallest.height), desktop.height);
    return {std::max(std::min(stored.x, desktop.width - width), 0),
            std::max(std::min(stored.y, desktop.height - height), 0), width, height};
}

int Frame_ToolIconSize(const char *setting)
{
    const int LARGEST = 256; // beyond that, the tools would leave no room for the list
    long size = setting ? strtol(setting, nullptr, 10) : 0;
    if (size <= TOOL_ICON_SIZE)
        return TOOL_ICON_SIZE;
    return static_cast<int>(std::min<long>(size, LARGEST)) + 4;
}

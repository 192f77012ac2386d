// tests/frame_rules_test.cpp - the frame's place, size and tool icons.
#include <gtest/gtest.h>

#include "app/FrameRules.h"

static const FrameSize Smallest = {800, 600}, Screen = {1920, 1080};

static void ExpectPlace(FrameGeometry expected, FrameGeometry stored, FrameSize desktop = Screen)
{
    FrameGeometry fit = Frame_FitGeometry(stored, Smallest, desktop);
    EXPECT_EQ(expected.x, fit.x);
    EXPECT_EQ(expected.y, fit.y);
    EXPECT_EQ(expected.width, fit.width);
    EXPECT_EQ(expected.height, fit.height);
}

TEST(FrameFitGeometry, KeepsAPlaceOnTheDesktop)
{
    ExpectPlace({50, 50, 800, 600}, {50, 50, 800, 600});
    ExpectPlace({1120, 480, 800, 600}, {1120, 480, 800, 600}); // just at the edges
    ExpectPlace({0, 0, 1920, 1080}, {0, 0, 1920, 1080});
}

TEST(FrameFitGeometry, RaisesASmallSize)
{
    ExpectPlace({10, 20, 800, 600}, {10, 20, 300, 599});
}

TEST(FrameFitGeometry, PullsTheWindowBackOntoTheDesktop)
{
    ExpectPlace({1120, 100, 800, 600}, {1800, 100, 800, 600});
    ExpectPlace({100, 480, 800, 600}, {100, 5000, 800, 600});
    ExpectPlace({0, 0, 900, 700}, {-5, -300, 900, 700});
}

TEST(FrameFitGeometry, IsNoLargerThanTheDesktop)
{
    ExpectPlace({0, 0, 1920, 1080}, {50, 50, 4000, 3000});
    ExpectPlace({0, 0, 640, 480}, {50, 50, 800, 600}, {640, 480});
}

TEST(FrameToolIconSize, IsSixteenWithoutALargerSetting)
{
    EXPECT_EQ(16, Frame_ToolIconSize(nullptr));
    EXPECT_EQ(16, Frame_ToolIconSize(""));
    EXPECT_EQ(16, Frame_ToolIconSize("16"));
    EXPECT_EQ(16, Frame_ToolIconSize("-24"));
    EXPECT_EQ(16, Frame_ToolIconSize("large"));
}

TEST(FrameToolIconSize, IsALittleMoreThanALargerSetting)
{
    EXPECT_EQ(21, Frame_ToolIconSize("17"));
    EXPECT_EQ(28, Frame_ToolIconSize("24"));
    EXPECT_EQ(260, Frame_ToolIconSize("100000")); // and leaves room for the list
}

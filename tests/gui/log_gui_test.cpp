// tests/gui/log_gui_test.cpp - the toolkit's messages on their way to the program's log.

#include "tests/gui/GuiTest.h"

#include <wx/log.h>

#include "app/LogGui.h"
#include "base/Companion.h"

// What `log` makes the toolkit write.
template <class Function> static std::vector<LogLine> Written(Function log)
{
    ForgetLog();
    log();
    return TakeLog("");
}

using Lines = std::vector<LogLine>;

TEST(MyLogGui, IsTheLogOfTheApplication)
{
    EXPECT_NE(nullptr, dynamic_cast<MyLogGui *>(wxLog::GetActiveTarget()));
}

TEST(MyLogGui, PassesMessagesOnWithoutADialog)
{
    EXPECT_EQ((Lines{{"Cartulo-WX-ERROR: Error: no \xC3\xBC", TNS_ERROR}}),
              Written([] { wxLogError(L"no \u00FC"); }));
    EXPECT_EQ((Lines{{"Cartulo-WX-WARNING: Warning: hm", TNS_WARNING}}),
              Written([] { wxLogWarning("hm"); }));
    EXPECT_EQ((Lines{{"Cartulo-WX-INFO: by the way", TNS_ACTION}}),
              Written([] { wxLogMessage("by the way"); }));
    EXPECT_EQ((Lines{{"Cartulo-WX-INFO: more", TNS_ACTION}}), Written([] { wxLogInfo("more"); }));
}

TEST(MyLogGui, DropsDebuggingAndTraces)
{
    EXPECT_EQ(Lines(), Written([] { wxLogDebug("inside"); }));
    EXPECT_EQ(Lines(), Written([] { wxLogTrace("mask", "inside"); }));
}

TEST(MyAppTraits, LogsAnAssertionAndGoesOn)
{
    bool stop = true;
    MyAppTraits traits;
    EXPECT_EQ((Lines{{"Cartulo-Assert: wrong", TNS_ASSERT}}),
              Written([&] { stop = traits.ShowAssertDialog("wrong"); }));
    EXPECT_FALSE(stop);
}

// The toolkit's messages on their way to the program's log.

#include <gtest/gtest.h>

#include <string>

#include <wx/log.h>

#include "app/LogGui.h"

// What `log` makes the toolkit write to standard error, at the default level of the log.
template <class Function> static std::string Written(Function log)
{
    testing::internal::CaptureStderr();
    log();
    return testing::internal::GetCapturedStderr();
}

TEST(MyLogGui, IsTheLogOfTheApplication)
{
    EXPECT_NE(nullptr, dynamic_cast<MyLogGui *>(wxLog::GetActiveTarget()));
}

TEST(MyLogGui, PassesErrorsAndWarningsOnWithoutADialog)
{
    EXPECT_EQ("Cartulo-WX-ERROR: Error: no \xC3\xBC\n", Written([] { wxLogError(L"no \u00FC"); }));
    EXPECT_EQ("Cartulo-WX-WARNING: Warning: hm\n", Written([] { wxLogWarning("hm"); }));
}

TEST(MyLogGui, KeepsInformationBelowTheDefaultLevel)
{
    EXPECT_EQ("", Written([] { wxLogMessage("by the way"); }));
}

TEST(MyAppTraits, LogsAnAssertionAndGoesOn)
{
    bool stop = true;
    MyAppTraits traits;
    EXPECT_EQ("Cartulo-Assert: wrong\n", Written([&] { stop = traits.ShowAssertDialog("wrong"); }));
    EXPECT_FALSE(stop);
}

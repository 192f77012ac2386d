// app/LogGui.cpp - the toolkit's messages and assertions on their way to TNSMessage.

#include "app/LogGui.h"

#include "base/Companion.h"

void MyLogGui::DoLogTextAtLevel(wxLogLevel level, const wxString &text)
{
    if (level <= wxLOG_Error)
        TNSMessage("Cartulo-WX-ERROR: ", text.utf8_str(), TNS_ERROR);
    else if (level == wxLOG_Warning)
        TNSMessage("Cartulo-WX-WARNING: ", text.utf8_str(), TNS_WARNING);
    else
        TNSMessage("Cartulo-WX-INFO: ", text.utf8_str(), TNS_ACTION);
}

wxLog *MyAppTraits::CreateLogTarget()
{
    return new MyLogGui;
}

bool MyAppTraits::ShowAssertDialog(const wxString &text)
{
    TNSMessage("Cartulo-Assert: ", text.utf8_str(), TNS_ASSERT);
    return false;
}

void Log_SetUpToolkit()
{
    wxSetAssertHandler(nullptr);
    wxLog::SetLogLevel(wxLOG_Info);
    wxLog::DisableTimestamp();
}

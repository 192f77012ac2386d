// app/LogGui.h - the toolkit's messages and assertions on their way to TNSMessage.
#pragma once

#include <wx/apptrait.h>
#include <wx/log.h>

class MyLogGui : public wxLog
{
protected:
    void DoLogTextAtLevel(wxLogLevel level, const wxString &text) override;
};

// Gives the application MyLogGui, so that no toolkit message becomes a dialog.
class MyAppTraits : public wxGUIAppTraits
{
public:
    wxLog *CreateLogTarget() override;
    bool ShowAssertDialog(const wxString &text) override; // false: the program goes on
};

// Before the application object starts: no assertions, messages from information upwards, no
// time stamps.
void Log_SetUpToolkit();

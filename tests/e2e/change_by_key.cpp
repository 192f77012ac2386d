// tests/e2e/change_by_key.cpp - linked with the editor's main program: F12 changes the selected
// entry in the store, as an editing command would.
#include <cstdlib>
#include <string>

#include <wx/app.h>
#include <wx/eventfilter.h>
#include <wx/module.h>

#include "app/Log.h"
#include "app/MyFrame.h"
#include "ui/Cartulo.h"

// The index of the file that holds the entry; -1 for none.
static int FileOf(const BibFileSet *set, const BibEntry *entry)
{
    for (int i = 0; i < set->count; ++i)
        for (const BibEntry *other = set->files[i]->entries; other; other = other->next)
            if (other == entry)
                return i;
    return -1;
}

// Puts a letter at the end of its first value.
static void ChangeEntry(Cartulo *panel)
{
    const BibEntry *entry = panel->CurrentEntry();
    int file = entry ? FileOf(panel->Files(), entry) : -1;
    if (file < 0 || entry->fieldCount == 0)
        return;
    BibEntry *changed = const_cast<BibEntry *>(entry);
    std::string value = std::string(changed->fields[0].value) + "X";
    free(changed->fields[0].value);
    changed->fields[0].value = Bib_CopyText(value.c_str(), value.size());
    panel->SetModified(file);
    AppLog("Changed: ", entry->key);
}

class ChangeByKey : public wxModule, private wxEventFilter
{
public:
    bool OnInit() override
    {
        wxEvtHandler::AddFilter(this);
        return true;
    }

    void OnExit() override { wxEvtHandler::RemoveFilter(this); }

private:
    int FilterEvent(wxEvent &event) override
    {
        if (event.GetEventType() != wxEVT_CHAR_HOOK ||
            static_cast<wxKeyEvent &>(event).GetKeyCode() != WXK_F12)
            return Event_Skip;
        MyFrame *frame = dynamic_cast<MyFrame *>(wxTheApp->GetTopWindow());
        if (frame && frame->Panel())
            ChangeEntry(frame->Panel());
        return Event_Processed;
    }

    wxDECLARE_DYNAMIC_CLASS(ChangeByKey);
};

wxIMPLEMENT_DYNAMIC_CLASS(ChangeByKey, wxModule);

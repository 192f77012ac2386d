// tests/gui/EditTest.h - tests of the window while an entry is edited.
#pragma once

#include <cstdlib>
#include <filesystem>

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "tests/gui/GuiTest.h"
#include "ui/Cartulo.h"
#include "ui/Ids.h"
#include "ui/QListBox.h"

inline const char Article[] =
    "@article{one,\n  author = {A},\n  title = {T},\n  year = {1999}\n}\n";
inline const char Child[] = "@article{child,\n  crossref = {parent},\n  title = {T}\n}\n"
                            "@book{parent,\n  title = {P},\n  year = {1999}\n}\n";
inline const char EditTypes[] = "[article]\n*=a paper\nauthor=*editor\neditor=*author\ntitle=*\n"
                                "year=*\nnote=\ncrossref=!\n[book]\ntitle=*\npublisher=*\nyear=*\n";

inline const char CommitTitle[] = "Commit of Bibliography Entry - Question";

class Edit : public CartuloWindow
{
protected:
    void SetUp() override
    {
        setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1);
        std::filesystem::create_directory(folder.Path("Cartulo"));
        folder.Write("Cartulo/cartulo.ini", EditTypes);
    }

    void OpenText(const std::string &text) { Open(folder.Write("a.bib", text)); }

    void Send(int id)
    {
        Panel()->GetEventHandler()->QueueEvent(new wxCommandEvent(wxEVT_MENU, id));
        HandleQueuedEvents();
    }

    void StartEditing()
    {
        Send(ID_EDIT_ENTRY);
        ASSERT_TRUE(Panel()->InEditMode());
    }

    std::vector<wxTextCtrl *> Values() const
    {
        std::vector<wxTextCtrl *> values;
        for (wxWindow *child : EntryPane()->GetChildren()) {
            wxTextCtrl *value = dynamic_cast<wxTextCtrl *>(child);
            if (value && value->IsShown() && !value->IsMultiLine())
                values.push_back(value);
        }
        return values;
    }

    wxTextCtrl *Value(const wxString &key) const
    {
        std::vector<Field> fields = ShownFields();
        for (size_t i = 0; i < fields.size(); ++i)
            if (fields[i].label == key)
                return Values()[i];
        ADD_FAILURE() << "no field " << key;
        return nullptr;
    }

    void SetValue(const wxString &key, const wxString &text) { Value(key)->SetValue(text); }

    // What is said of missing fields.
    wxStaticText *NoteText() const
    {
        wxStaticText *last = nullptr;
        for (wxWindow *child : EntryPane()->GetChildren())
            if (wxStaticText *text = dynamic_cast<wxStaticText *>(child))
                last = text;
        return last;
    }
    wxString Note() const { return NoteText()->GetLabelText(); }

    bool EntryPaneSays(const wxString &text) const
    {
        for (wxWindow *child : EntryPane()->GetChildren()) {
            wxStaticText *label = dynamic_cast<wxStaticText *>(child);
            if (label && label->IsShown() && label->GetLabelText() == text)
                return true;
        }
        return false;
    }

    wxButton *Remover(int row) const
    {
        return dynamic_cast<wxButton *>(Panel()->FindWindow(ID_REMOVE_ROW + row));
    }

    wxComboBox *NewKey() const
    {
        return dynamic_cast<wxComboBox *>(Panel()->FindWindow(ID_NEW_FIELD_KEY));
    }

    wxChoice *Type() const { return dynamic_cast<wxChoice *>(Panel()->FindWindow(ID_TYPE)); }

    void Choose(const wxString &type)
    {
        ASSERT_TRUE(Type()->SetStringSelection(type));
        wxCommandEvent event(wxEVT_CHOICE, ID_TYPE);
        event.SetEventObject(Type());
        Type()->ProcessWindowEvent(event);
    }

    void PressRemover(int row) { Press(ID_REMOVE_ROW + row); }

    void AddField(const wxString &key)
    {
        NewKey()->SetValue(key);
        Send(ID_NEW_FIELD);
    }

    void Focus(wxWindow *window)
    {
        window->SetFocus();
        ASSERT_TRUE(WaitForKeys(window));
    }

    static ExpectBox Question(const char *type, int added, int modified, int removed, int button)
    {
        return ExpectBox(CommitTitle,
                         wxString::Format("There are changes in this entry:\n\n"
                                          "\tmodified type: \t%s\n\tadded fields: \t%d\n"
                                          "\tmodified fields: \t%d\n\tremoved fields: \t%d\n"
                                          "\nDo you want to accept these changes ?",
                                          type, added, modified, removed),
                         button, wxYES_NO | wxCANCEL | wxICON_QUESTION);
    }

    std::string Saved()
    {
        Panel()->SaveAll(true);
        return folder.Read("a.bib");
    }
};

// ui/EntryDialogs.h - the windows that add an entry and rename one.
//
// Their OK handlers change the store only. After the window is closed the caller asks for
// Changed(), and updates list and pane.
#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "session/EntryRules.h"

class wxCheckBox;
class wxChoice;
class wxFlexGridSizer;
class wxTextCtrl;

enum { ID_ENTRY_FILE = 6001, ID_ENTRY_KEY, ID_ENTRY_TYPE, ID_ENTRY_CHILD };

// What the panel shows. The set and the entry outlive the dialog.
struct EntryPlace {
    const BibFileSet *set;
    int file;        // -1 for none
    BibEntry *entry; // of that file; null for none
};

// What both windows have: a file, a key and a type.
class EntryDialog : public wxDialog
{
public:
    BibEntry *Changed() const { return m_changed; } // the entry; null when nothing was changed

protected:
    struct Texts {
        const char *title, *fileLabel, *keyLabel;
        const char *caption; // of the boxes
        const char *emptyKey, *takenKey, *takenElsewhere;
    };

    EntryDialog(wxWindow *parent, const EntryPlace &current, const Texts &texts);

    int CurrentChoice() const;
    TypedName Key(const BibFile *file) const; // as text of the file; null for none

    // False when it can't be the key; the user knows why then, or has one without bad characters.
    bool Accept(KeyVerdict verdict, const TypedName &key);
    void Refuse(const wxString &text);

    EntryPlace m_current;
    std::vector<int> m_files; // the index in the set for each item of the choice
    wxChoice *m_file;         // child windows
    wxTextCtrl *m_key;
    wxChoice *m_type;
    wxFlexGridSizer *m_rows; // for Dialog_Finish
    BibEntry *m_changed = nullptr;

private:
    void FillFiles();
    bool AcceptDuplicate();

    Texts m_texts;
};

class Cartulo_NewEntry : public EntryDialog
{
public:
    // `ini` describes the entry types.
    Cartulo_NewEntry(wxWindow *parent, const EntryPlace &current, const std::string &ini);

private:
    void SelectFile();
    int TargetFile() const;
    void OnOK(wxCommandEvent &event);
    bool Create(int file, const std::string &key);

    std::string m_ini;
    wxCheckBox *m_child; // child window

    wxDECLARE_EVENT_TABLE();
};

class Cartulo_RenameEntry : public EntryDialog
{
public:
    Cartulo_RenameEntry(wxWindow *parent, const EntryPlace &current);

private:
    bool MayRename() const;
    bool Rename(BibFile *file, const std::string &key);
    void OnOK(wxCommandEvent &event);

    wxDECLARE_EVENT_TABLE();
};

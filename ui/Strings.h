// ui/Strings.h - the windows for abbreviations: the list of a source, and one of them.
#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "ui/StringRules.h"

class wxChoice;
class wxListBox;
class wxTextCtrl;

class Cartulo_Strings : public wxDialog
{
public:
    // For the abbreviations of the files and of the lists in the INI file. "Insert" puts the
    // selected one into `target`, at its cursor; null: there is nothing to insert into. All outlive
    // the dialog.
    Cartulo_Strings(wxWindow *parent, const BibFileSet *files, const std::string &ini,
                    wxTextCtrl *target);

    BibFile *WritableFile() const; // of the list, where that can be changed; null for none
    const StringSources *Sources() const { return &m_sources; }

private:
    wxSizer *CreateSourceRow();
    wxSizer *CreateCommands();
    wxSizer *CreateClosers();
    void FillSources();
    void UpdateStrings();
    void ShowLines(const std::vector<StringLine> &lines);
    void Select(int row);
    std::string SelectedKey() const;
    BibString *SelectedString() const;
    void Insert(const wxString &text);
    void OnSource(wxCommandEvent &event);
    void OnAdd(wxCommandEvent &event);
    void OnRemove(wxCommandEvent &event);
    void OnEdit(wxCommandEvent &event);
    void OnActivate(wxCommandEvent &event);
    void OnOK(wxCommandEvent &event);
    void OnCharHook(wxKeyEvent &event);
    bool MayChange();
    void OnKeyUp(wxKeyEvent &event);

    wxTextCtrl *m_target;
    StringSources m_sources;
    std::vector<StringLine> m_lines; // of the list
    wxChoice *m_source;              // child windows
    wxListBox *m_list;
    int32_t m_removeTime = 0; // of the last press of the key that deletes, until it is released

    wxDECLARE_EVENT_TABLE();
};

class Cartulo_Strings_Edit : public wxDialog
{
public:
    // `string` is one of the writable file that `strings` shows now; null: a new one for that.
    Cartulo_Strings_Edit(Cartulo_Strings *strings, const wxString &title, BibString *string);

    bool IsChanged() const { return m_isChanged; } // the file's abbreviations are others now

private:
    void Fill();
    void Refuse(const wxString &text, wxTextCtrl *at);
    bool AcceptKey(const TypedName &key, NameVerdict verdict);
    bool AcceptValue(const std::string &value);
    bool AcceptLosses(const std::wstring &losses);
    bool RefuseForMemory();
    bool Add();
    bool Edit();
    void OnOK(wxCommandEvent &event);

    const StringSources *m_sources; // these outlive the dialog
    BibFile *m_file;
    const EncodingRecord *m_encoding; // of the file
    BibString *m_string;              // null for a new one
    wxTextCtrl *m_key;                // child windows
    wxTextCtrl *m_value;
    wxString m_filled; // what the value's control made of the stored value
    bool m_isChanged = false;

    wxDECLARE_EVENT_TABLE();
};

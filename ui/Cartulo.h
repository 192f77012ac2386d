// ui/Cartulo.h - the editor panel: the entry list at the left, the selected entry at the right.
#pragma once

#include <wx/panel.h>
#include <wx/scrolwin.h>
#include <wx/sizer.h>
#include <wx/splitter.h>

#include <string>

#include "session/CommandLine.h"
#include "session/FileSet.h"
#include "ui/FieldGrid.h"
#include "ui/PanelRules.h"

class Cartulo_Messages;
class EntryPane;
class QListBox;

class Cartulo : public wxSplitterWindow
{
public:
    // Loads the files that the command line names. `state` outlives the panel; citing takes its
    // `sendCommand`.
    Cartulo(wxWindow *parent, const char *commandLine, CommandState *state);
    ~Cartulo() override;

    const BibFileSet *Files() const { return &m_set; }
    const std::string &Ini() const { return m_ini; }         // path of the INI file
    const BibEntry *CurrentEntry() const { return m_entry; } // null for none
    bool InEditMode() const { return m_editMode; }
    bool IsBusy() const { return m_busy; } // loading, saving, or asking about it or a commit

    // The button that closed the last window for adding or renaming an entry; 0 for none yet.
    int DialogResult() const { return m_dialogResult; }

    // Ends editing as "Done" does: asks about changes. False when the user wants to go on with it,
    // or has to. Whatever may take the entry away asks this first.
    bool FinishEditing();

    // Carries out a command line: opens and closes files and rebuilds the list. `origin` says
    // where the line came from; it changes nothing. Returns 0. Call ShowOpenFiles after it.
    int ProcessCommand(const char *commandLine, const char *origin);

    void ShowOpenFiles(); // the panes, the tools and the entry for what is open now

    void FocusList();         // unless there is none
    void HoldSash(bool hold); // whether it stays where it is when the window changes its size

    void SetModified(int file); // the file of this index has one change more

    // Saves all modified files; unless `quiet`, asks first. -1 when the user cancelled, 0 when
    // nothing was saved or a save failed, 1 when every modified file was saved.
    int SaveAll(bool quiet);

    wxString CountText() const;    // "There are ... entries in ... BIB files."
    wxString EncodingText() const; // of the file of the current entry

    // The files with unsaved changes, and why they could not be saved where that was tried.
    wxString UnsavedText() const;

    void Update_Tools();                        // enables the tools that apply now
    void ShowEntry(BibEntry *entry, int file);  // fills the entry pane; null changes nothing
    void Update_Field_Colors(const char *type); // of the labels that are shown
    void CheckMandatoryFields(int last); // fills "Add Field:" and the note; rows up to `last` count
    void UpdateHelpText();               // for the mode and the type
    void OnSearch(wxCommandEvent &event);        // takes the text of a search field
    void OnIndexChanged(wxCommandEvent &event);  // a row was selected
    void OnIndexActivate(wxCommandEvent &event); // a row was double-clicked

private:
    void ReadSchema();
    wxWindow *Pane(PanelPane pane);
    void Split(wxWindow *pane);
    void Arrange();
    void ShowAlone(wxWindow *pane);
    void ReplacePane(wxWindow *pane);
    void KeepSashPosition();
    void OpenFile(const std::string &path);
    void ShowSelection();
    void ClearEntry();
    void SetEditMode(bool on);
    void FocusForMode();
    void ToggleEditing();
    void FollowList();
    void CommitEntry();
    bool Commit();
    int Ask(const wxString &caption, const wxString &text, int buttons);
    bool TakeType(int *type);
    bool AcceptLosses();
    bool CheckRows();
    bool ReplaceEntry(int type);
    void AddField(const std::string &key);
    int RowForCommand(const char *logPrefix);
    void RemoveRow(int row);
    const EncodingRecord *Encoding() const; // of the current entry
    void ShowChanged(BibEntry *entry);
    void RemoveEntry(int row);
    void UpdateSaveTool();
    void ShowRow(const char *handler);

    void OnOpen(wxCommandEvent &event);
    void OnSave(wxCommandEvent &event);
    void OnShowMessages(wxCommandEvent &event);
    void OnInsertCite(wxCommandEvent &event);
    void OnEditStrings(wxCommandEvent &event);
    void OnEditPreamble(wxCommandEvent &event);
    void OnNewEntry(wxCommandEvent &event);
    void OnRenameEntry(wxCommandEvent &event);
    void OnRemoveEntry(wxCommandEvent &event);
    void OnEditEntry(wxCommandEvent &event);
    void OnChangeType(wxCommandEvent &event);
    void OnCommitEntry(wxCommandEvent &event);
    void OnNewField(wxCommandEvent &event);
    void OnEditField(wxCommandEvent &event);
    void OnRenameField(wxCommandEvent &event);
    void OnRemoveField(wxCommandEvent &event);
    void OnSashMove(wxSplitterEvent &event);
    void OnPaint(wxPaintEvent &event);
    bool TryBefore(wxEvent &event) override;

    BibFileSet m_set = {};
    CommandState *m_state;
    BibEntry *m_entry = nullptr; // owned by its file; null whenever that may be freed
    int m_file = -1;             // index of the file that holds m_entry
    std::string m_typeName;      // of the current entry, as it is chosen now
    std::wstring m_searchText;   // what the search field holds
    std::string m_search;        // the same in the selected encoding
    bool m_isPainted = false;
    FieldGrid m_grid = {};   // what the entry pane shows
    bool m_editMode = false; // else the list is in use
    bool m_busy = false;     // see IsBusy
    int m_dialogResult = 0;
    std::string m_ini;  // path of the INI file with the entry types
    std::string m_name; // of the application, from there
    int m_sashPosition; // of the split window, kept while it is not split

    QListBox *m_list = nullptr; // child windows, made after the first files are loaded
    EntryPane *m_entryPane = nullptr;
    wxPanel *m_openPane = nullptr; // these two when they are needed
    wxPanel *m_newPane = nullptr;
    Cartulo_Messages *m_messages = nullptr; // while it is open

    wxDECLARE_EVENT_TABLE();
};

// ui/Preamble.h - the window for the preambles of the open files.
#pragma once

#include <wx/dialog.h>

#include <string>
#include <vector>

#include "ui/PreambleText.h"

class wxChoice;
class wxClipboardTextEvent;
class wxTextCtrl;

enum { ID_PREAMBLE_FILE = 6001, ID_PREAMBLE_TEXT };

class Cartulo_Preamble : public wxDialog
{
public:
    Cartulo_Preamble(wxWindow *parent, const BibFileSet *files); // they outlive the dialog

private:
    void FillFiles();
    void UpdatePreamble();
    void ShowEditable(bool editable);
    const EncodingRecord *Encoding() const;
    BibFile *WritableFile() const;
    PreambleEdit ReadEdit(const BibFile *file) const;
    bool IsChanged(const BibFile *file, const PreambleEdit &edit) const;
    bool Allow(const std::string &reason);
    bool MayStore(const PreambleEdit &edit);
    bool Store(BibFile *file, const PreambleEdit &edit);
    bool LeaveFile();
    bool Refuse(const std::vector<PreambleFault> &faults);
    bool Accept();
    void OnFile(wxCommandEvent &event);
    void OnPaste(wxClipboardTextEvent &event);
    void OnOK(wxCommandEvent &event);

    const BibFileSet *m_files;
    wxChoice *m_file; // child windows
    wxTextCtrl *m_text;
    wxString m_filled; // what m_text was filled with

    wxDECLARE_EVENT_TABLE();
};

// ui/Preamble.cpp - the window for the preambles of the open files.
#include "ui/Preamble.h"

#include <wx/choice.h>
#include <wx/clipbrd.h>
#include <wx/msgdlg.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/textbuf.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/FieldCheck.h"
#include "session/Values.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Status.h"
#include "ui/Theme.h"

static const char QuestionCaption[] = "Editing Preamble Question";

wxBEGIN_EVENT_TABLE(Cartulo_Preamble, wxDialog)
    EVT_TEXT_PASTE(ID_PREAMBLE_TEXT, Cartulo_Preamble::OnPaste)
    EVT_CHOICE(ID_PREAMBLE_FILE, Cartulo_Preamble::OnFile)
    EVT_BUTTON(wxID_OK, Cartulo_Preamble::OnOK)
wxEND_EVENT_TABLE()

Cartulo_Preamble::Cartulo_Preamble(wxWindow *parent, const BibFileSet *files)
    : wxDialog(parent, wxID_ANY, "Editing Preamble", wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER),
      m_files(files)
{
    SetFont(wxFontInfo(10));
    m_file = new wxChoice(this, ID_PREAMBLE_FILE);
    m_text = new wxTextCtrl(this, ID_PREAMBLE_TEXT, "There is no editable BIB-files", // stands so
                            wxDefaultPosition, wxDefaultSize, wxTE_MULTILINE | wxTE_DONTWRAP);
    m_text->SetFont(wxFontInfo(10).Family(wxFONTFAMILY_TELETYPE));
    m_text->SetMinSize(FromDIP(wxSize(600, 200)));
    FillFiles();

    wxFlexGridSizer *heading = Dialog_CreateRows(this);
    Dialog_AddRow(heading, this, "Show Preamble of BIB-file:", m_file);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(heading, wxSizerFlags().Expand().Border(wxBOTTOM, FromDIP(DIALOG_BORDER)));
    column->Add(m_text, wxSizerFlags(1).Expand());
    Dialog_Finish(this, column, m_text);
}

void Cartulo_Preamble::FillFiles()
{
    if (m_files->count == 0) {
        TNSMessage("ERROR: ", "There is no editable BIB files", TNS_ERROR); // stands so
        ShowEditable(false);
        return;
    }
    for (int i = 0; i < m_files->count; ++i)
        m_file->Append(ShortText(m_file, PathText(m_files->files[i]->baseName), DIALOG_ITEM));
    CurrentPreamble = Preamble_FitFile(m_files, CurrentPreamble);
    m_file->SetSelection(CurrentPreamble);
    UpdatePreamble();
}

// Of files with one name, the last is shown, and chosen.
void Cartulo_Preamble::UpdatePreamble()
{
    const char *name = m_files->files[CurrentPreamble]->baseName;
    TNSMessage("INFO: Cartulo_Preamble::UpdatePreamble ", PathText(name).utf8_str(), TNS_ACTION);
    CurrentPreamble = Preamble_FindFile(m_files, name);
    const BibFile *file = m_files->files[CurrentPreamble];
    m_file->SetSelection(CurrentPreamble);
    m_file->SetToolTip(FileTip(file));
    m_filled = StoreText(file->preamble, Bib_Encoding(file));
    m_text->ChangeValue(m_filled);
    m_text->SetInsertionPoint(0);
    bool isWhole = m_text->GetValue() == m_filled;
    m_text->SetToolTip(isWhole ? "" : Text_LockedTip);
    ShowEditable(!file->readOnly && isWhole);
}

void Cartulo_Preamble::ShowEditable(bool editable)
{
    m_text->SetEditable(editable);
    m_text->SetBackgroundColour(editable ? wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW)
                                         : Theme_LockedColour());
}

const EncodingRecord *Cartulo_Preamble::Encoding() const
{
    return Bib_Encoding(m_files->files[CurrentPreamble]);
}

// The file that is shown; null when its preamble can't be changed.
BibFile *Cartulo_Preamble::WritableFile() const
{
    return m_files->count > 0 && m_text->IsEditable() ? m_files->files[CurrentPreamble] : nullptr;
}

PreambleEdit Cartulo_Preamble::ReadEdit(const BibFile *file) const
{
    return Preamble_Read(m_text->GetValue().ToStdWstring(), file->preamble, Bib_Encoding(file));
}

bool Cartulo_Preamble::IsChanged(const BibFile *file, const PreambleEdit &edit) const
{
    return m_text->GetValue() != m_filled && edit.text != file->preamble;
}

// False when the text is too long, or the user does not want to lose what can't be stored.
bool Cartulo_Preamble::MayStore(const PreambleEdit &edit)
{
    if (!Allow(Preamble_CheckSize(edit.text)))
        return false;
    FieldFacts field = {};
    field.isChanged = true;
    field.label = L"PREAMBLE";
    field.text = edit.touched;
    field.stored = edit.replaced;
    field.encoding = Encoding();
    field.textGuillemets = Value_HoldsGuillemets(edit.replaced.c_str(), field.encoding);
    std::wstring losses = FieldCheck_Warnings(field);
    return losses.empty() ||
           Box_Ask(this, QuestionCaption, losses + FieldCheck_Question, wxNO_DEFAULT);
}

// Shows a reason against the text, if there is one.
bool Cartulo_Preamble::Allow(const std::string &reason)
{
    if (!reason.empty())
        Box_Warn(this, GetTitle(), reason);
    return reason.empty();
}

bool Cartulo_Preamble::Store(BibFile *file, const PreambleEdit &edit)
{
    return Change_SetPreamble(m_files, file, edit.text.c_str(), edit.places.data(),
                              int(edit.places.size())) != 0;
}

// False when the user wants to stay, or has to.
bool Cartulo_Preamble::LeaveFile()
{
    BibFile *file = WritableFile();
    if (!file)
        return true;
    PreambleEdit edit = ReadEdit(file);
    if (!IsChanged(file, edit))
        return true;
    int answer = wxMessageBox("There are changes in current preamble text.\n\n Do you want to "
                              "accept they ?", // stands so
                              QuestionCaption, wxYES_NO | wxICON_QUESTION, this);
    if (answer != wxYES)
        return answer == wxNO;
    return MayStore(edit) && Allow(Preamble_CheckMarks(edit.text)) && Store(file, edit);
}

// While it asks, the choice shows the file that it asks about.
void Cartulo_Preamble::OnFile(wxCommandEvent &)
{
    int chosen = Preamble_FindFile(m_files, m_files->files[m_file->GetSelection()]->baseName);
    m_file->SetSelection(CurrentPreamble);
    if (chosen == CurrentPreamble || !LeaveFile())
        return;
    CurrentPreamble = chosen;
    UpdatePreamble();
}

static bool ReadClipboard(wxString *text)
{
    wxClipboardLocker lock;
    wxTextDataObject data;
    if (!lock || !wxTheClipboard->GetData(data))
        return false;
    *text = wxTextBuffer::Translate(data.GetText(), wxTextFileType_Unix);
    return true;
}

// Its line ends are those of Enter: CR LF would end pieces within braces. More than a file holds
// would only keep the control busy.
void Cartulo_Preamble::OnPaste(wxClipboardTextEvent &event)
{
    wxString text;
    if (!m_text->IsEditable() || !ReadClipboard(&text))
        event.Skip();
    else if (Allow(Preamble_CheckSize(Value_Read(text.ToStdWstring(), Encoding()))))
        m_text->WriteText(text);
}

static bool CopyText(const wxString &text)
{
    wxString unixText = wxTextBuffer::Translate(text, wxTextFileType_Unix);
    wxClipboardLocker lock;
    return !!lock && wxTheClipboard->SetData(new wxTextDataObject(unixText));
}

// True when the window may close: what was typed is in the clipboard then.
bool Cartulo_Preamble::Refuse(const std::vector<PreambleFault> &faults)
{
    for (const PreambleFault &fault : faults)
        Box_Warn(this, "Editing Preamble - Syntax Error",
                 BoundedText(StoreText(fault.piece.c_str(), Encoding())) + "\n:" + fault.reason +
                     // Misspelt, stands so.
                     "\n\nWrong preamble can;t be accepted.\nFix it and then try again.");
    if (!CopyText(m_text->GetValue())) {
        Box_Warn(this, GetTitle(),
                 "What you typed can't be copied to the clipboard, so it stays here.");
        return false;
    }
    ShowStatus(GetParent(), "The preamble is as it was; what you typed is in the clipboard.");
    return true;
}

// False when the window has to stay open.
bool Cartulo_Preamble::Accept()
{
    BibFile *file = WritableFile();
    if (!file)
        return true;
    PreambleEdit edit = ReadEdit(file);
    if (!IsChanged(file, edit)) {
        AppLog("Editing Preamble: ", "Preamble was not changed");
        return true;
    }
    AppLog("Editing Preamble: ", "Preamble was changed - save it.");
    if (!MayStore(edit))
        return false;
    std::vector<PreambleFault> faults = Preamble_Check(edit.text);
    if (!faults.empty())
        return Refuse(faults);
    return Store(file, edit);
}

void Cartulo_Preamble::OnOK(wxCommandEvent &event)
{
    TNSMessage("INFO: ", "Cartulo_Preamble::OnOK", TNS_ACTION);
    if (Accept())
        event.Skip(); // closes
}

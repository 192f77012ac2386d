// ui/Strings.cpp - the windows for abbreviations: the list of a source, and one of them.
#include "ui/Strings.h"

#include <algorithm>

#include <wx/choice.h>
#include <wx/listbox.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "base/Log.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/FieldCheck.h"
#include "session/Values.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/Icons.h"
#include "ui/Native.h"
#include "ui/Status.h"

static const char Caption[] = "Editing Strings"; // also of the boxes

// --- The list ---

wxBEGIN_EVENT_TABLE(Cartulo_Strings, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_Strings::OnOK)
    EVT_CHOICE(ID_STRING_SOURCE, Cartulo_Strings::OnSource)
    EVT_BUTTON(ID_STRING_ADD, Cartulo_Strings::OnAdd)
    EVT_BUTTON(ID_STRING_REMOVE, Cartulo_Strings::OnRemove)
    EVT_BUTTON(ID_STRING_EDIT, Cartulo_Strings::OnEdit)
    EVT_LISTBOX_DCLICK(wxID_ANY, Cartulo_Strings::OnActivate)
    EVT_CHAR_HOOK(Cartulo_Strings::OnCharHook)
wxEND_EVENT_TABLE()

Cartulo_Strings::Cartulo_Strings(wxWindow *parent, const BibFileSet *files, const std::string &ini,
                                 wxTextCtrl *target)
    : wxDialog(parent, wxID_ANY, Caption, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER),
      m_target(target), m_sources(Strings_Sources(files, ini))
{
    TNSMessage("INFO: Cartulo_Strings::Cartulo_Strings ", "Initialize", TNS_LIFECYCLE);
    SetFont(wxFontInfo(10));
    wxSizer *sourceRow = CreateSourceRow();
    m_list = new wxListBox(this, wxID_ANY);
    m_list->SetMinSize(FromDIP(wxSize(240, 120)));
    wxBoxSizer *middle = new wxBoxSizer(wxHORIZONTAL);
    middle->Add(m_list, wxSizerFlags(1).Expand());
    middle->Add(CreateCommands(), wxSizerFlags().Border(wxLEFT, FromDIP(DIALOG_GAP)));

    const int border = FromDIP(DIALOG_BORDER);
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(sourceRow, wxSizerFlags().Expand().Border(wxALL, border));
    column->Add(middle, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, border));
    column->Add(CreateClosers(), Dialog_ButtonPlace(this));
    FillSources();
    UpdateStrings();
    for (wxWindow *child : GetChildren())
        child->Bind(wxEVT_KEY_UP, &Cartulo_Strings::OnKeyUp, this);
    SetSizerAndFit(column);
    SetSize(FromDIP(wxSize(620, 420)));
    CentreOnParent();
    m_list->SetFocus();
}

wxSizer *Cartulo_Strings::CreateSourceRow()
{
    m_source = new wxChoice(this, ID_STRING_SOURCE);
    wxFlexGridSizer *row = Dialog_CreateRows(this);
    Dialog_AddRow(row, this, "Show Strings of BIB-file:", m_source);
    return row;
}

wxSizer *Cartulo_Strings::CreateCommands()
{
    static const struct {
        int id;
        const char *label, *tip, *icon;
    } buttons[] = {
        {ID_STRING_ADD, "&Add", "Add new string (Alt+A)", "list-add"},
        {ID_STRING_REMOVE, "&Delete", "Remove currently selected string (Alt+D)", "list-remove"},
        {ID_STRING_EDIT, "&Edit", "Edit value of currently selected string (Alt+E)", "list-edit"},
    };
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    for (const auto &button : buttons) {
        xBitmapButton *window = new xBitmapButton(this, button.id, button.label, button.icon);
        window->SetToolTip(button.tip);
        column->Add(window, wxSizerFlags().Expand().Border(wxBOTTOM, FromDIP(DIALOG_GAP)));
    }
    return column;
}

wxSizer *Cartulo_Strings::CreateClosers()
{
    wxButton *insert = new wxButton(this, wxID_OK, "Insert");
    insert->Enable(m_target != nullptr);
    wxStdDialogButtonSizer *buttons = new wxStdDialogButtonSizer;
    buttons->AddButton(insert);
    buttons->AddButton(new wxButton(this, wxID_CANCEL, "Close"));
    buttons->Realize();
    SetAffirmativeId(wxID_OK);
    SetEscapeId(wxID_CANCEL);
    return buttons;
}

void Cartulo_Strings::FillSources()
{
    const BibFileSet *set = m_sources.set;
    wxArrayString items;
    for (const std::string &list : m_sources.lists)
        items.Add(ShortText(m_source, OwnText(list.c_str()), DIALOG_ITEM));
    items.Add("*All Files*");
    for (int i = 0; i < set->count; ++i)
        items.Add(ShortText(m_source, PathText(set->files[i]->baseName), DIALOG_ITEM));
    m_source->Append(items);
    CurrentStringSource = Strings_FitSource(&m_sources, CurrentStringSource);
    m_source->SetSelection(CurrentStringSource + Strings_FirstFile(&m_sources));
}

BibFile *Cartulo_Strings::WritableFile() const
{
    return Strings_WritableFile(&m_sources, CurrentStringSource);
}

void Cartulo_Strings::UpdateStrings()
{
    TNSMessage("INFO: Cartulo_Strings::UpdateStrings ", "", TNS_ACTION);
    int row = std::max(m_list->GetSelection(), 0);
    ShowLines(Strings_Lines(&m_sources, CurrentStringSource));
    Select(row);
    m_source->SetToolTip(
        CurrentStringSource < 0 ? "" : FileTip(m_sources.set->files[CurrentStringSource]));
    for (int id : {ID_STRING_ADD, ID_STRING_REMOVE, ID_STRING_EDIT})
        FindWindow(id)->Enable(WritableFile() != nullptr);
}

// A list that is filled anew takes a second until it shows the right rows at the right place.
void Cartulo_Strings::ShowLines(const std::vector<StringLine> &lines)
{
    LineChange change = Strings_Compare(m_lines, lines);
    wxArrayString items;
    for (size_t i = 0; i < change.added; ++i)
        items.Add(BoundedText(
            StoreText(lines[change.first + i].text.c_str(), lines[change.first + i].encoding)));
    bool replacesAll = change.removed == m_lines.size();
    m_lines = lines;
    if (replacesAll) {
        m_list->Set(items);
        return;
    }
    for (size_t i = 0; i < change.removed; ++i)
        m_list->Delete(unsigned(change.first));
    if (!items.empty())
        m_list->Insert(items, unsigned(change.first));
}

// That row, or the last one when there are not so many.
void Cartulo_Strings::Select(int row)
{
    row = std::min(row, int(m_lines.size()) - 1);
    if (row < 0)
        return;
    Native_MoveToRow(m_list, row);
    m_list->EnsureVisible(row);
}

std::string Cartulo_Strings::SelectedKey() const // "" when no row is selected
{
    int row = m_list->GetSelection();
    return row == wxNOT_FOUND ? "" : Strings_KeyOf(m_lines[row]);
}

// Null when there is none that can be changed.
BibString *Cartulo_Strings::SelectedString() const
{
    int row = m_list->GetSelection();
    const BibFile *file = WritableFile();
    if (!file || row == wxNOT_FOUND)
        return nullptr;
    std::string key = SelectedKey();
    BibString *string = String_Find(file, row, key.c_str());
    if (!string)
        AppLog("INTERNAL-ERROR: Can't locate string key: ", key.c_str());
    return string;
}

void Cartulo_Strings::OnSource(wxCommandEvent &)
{
    int source = m_source->GetSelection() - Strings_FirstFile(&m_sources);
    if (source == CurrentStringSource)
        return;
    CurrentStringSource = source;
    UpdateStrings();
}

// The new one is the last of its file.
void Cartulo_Strings::OnAdd(wxCommandEvent &)
{
    TNSMessage("INFO: ", "Cartulo_Strings::OnAdd", TNS_ACTION);
    if (!WritableFile())
        return;
    Cartulo_Strings_Edit dialog(this, "Creating New String Entry", nullptr);
    if (dialog.ShowModal() != wxID_OK)
        return;
    UpdateStrings();
    Select(int(m_lines.size()) - 1);
    ShowStatus(GetParent(), "");
}

void Cartulo_Strings::OnEdit(wxCommandEvent &)
{
    TNSMessage("INFO: ", "Cartulo_Strings::OnEdit", TNS_ACTION);
    BibString *string = SelectedString();
    if (!string)
        return;
    Cartulo_Strings_Edit dialog(this, "Editing the String Entry", string);
    if (dialog.ShowModal() != wxID_OK)
        return;
    UpdateStrings();
    if (!dialog.IsChanged())
        return;
    ShowStatus(GetParent(), "");
}

void Cartulo_Strings::OnRemove(wxCommandEvent &)
{
    TNSMessage("INFO: ", "Cartulo_Strings::OnRemove", TNS_ACTION);
    BibString *string = SelectedString();
    if (!string)
        return;
    wxString line = m_list->GetStringSelection();
    if (!Change_RemoveString(m_sources.set, WritableFile(), string))
        return;
    UpdateStrings();
    ShowStatus(GetParent(), "The string is deleted: " + line);
}

void Cartulo_Strings::OnActivate(wxCommandEvent &)
{
    if (!m_target && !MayChange())
        return;
    wxCommandEvent press(wxEVT_BUTTON, m_target ? int(wxID_OK) : int(ID_STRING_EDIT));
    ProcessWindowEvent(press);
}

void Cartulo_Strings::Insert(const wxString &text)
{
    AppLog("INFO:(1) ", text.utf8_str());
    long at = m_target->GetInsertionPoint();
    AppLog(wxString::Format("INFO: at %ld insert ", at).utf8_str(), text.utf8_str());
    wxString value = m_target->GetValue();
    bool taken = Text_Take(m_target, value.insert(size_t(at), text));
    m_target->SetInsertionPoint(taken ? at + long(text.length()) : at);
    if (!taken)
        Box_Warn(this, Caption, Text_TooLong);
}

void Cartulo_Strings::OnOK(wxCommandEvent &event)
{
    TNSMessage("INFO: ", "Cartulo_Strings::OnOK", TNS_ACTION);
    event.Skip(); // closes
    if (!m_target)
        return;
    AppLog("Cartulo_Strings::OnOK, Insert ");
    if (m_list->GetSelection() != wxNOT_FOUND) {
        const EncodingRecord *encoding = m_lines[m_list->GetSelection()].encoding;
        Insert(ENC_SHOWN_OPEN + StoreText(SelectedKey().c_str(), encoding) + ENC_SHOWN_CLOSE);
        return;
    }
    TNSMessage("WARNING: ", "Cartulo_Strings::OnOK has no selection.", TNS_WARNING);
    ShowStatus(GetParent(), "Nothing was inserted, as no string was selected.");
}

// On keyboards with other letters, the Latin one of the key.
static int KeyOf(const wxKeyEvent &event)
{
    int key = event.GetKeyCode();
    return key ? key : Native_LatinLetter(event);
}

void Cartulo_Strings::OnKeyUp(wxKeyEvent &event)
{
    event.Skip();
    const StringCommand *command = Strings_FindCommand(KeyOf(event));
    if (command && command->id == ID_STRING_REMOVE)
        m_removeTime = 0;
}

// Says so when not.
bool Cartulo_Strings::MayChange()
{
    if (!WritableFile())
        ShowStatusError(GetParent(), "Choose a file that can be written to change its strings.");
    return WritableFile() != nullptr;
}

// The letters do what they do with Alt, wherever the focus is: nothing is typed here.
void Cartulo_Strings::OnCharHook(wxKeyEvent &event)
{
    TNSMessage("INFO: Cartulo_Strings::OnCharHook ", "", TNS_LIFECYCLE);
    const StringCommand *command = Strings_FindCommand(KeyOf(event));
    if (!command) {
        event.Skip();
        return;
    }
    if (!MayChange())
        return;
    if (command->id == ID_STRING_REMOVE &&
        Strings_IsHeld(&m_removeTime, int32_t(event.GetTimestamp())))
        return;
    TNSMessage("INFO: Cartulo_Strings::OnCharHook ", command->label, TNS_LIFECYCLE);
    wxCommandEvent press(wxEVT_BUTTON, command->id);
    ProcessWindowEvent(press);
}

// --- One abbreviation ---

wxBEGIN_EVENT_TABLE(Cartulo_Strings_Edit, wxDialog)
    EVT_BUTTON(wxID_OK, Cartulo_Strings_Edit::OnOK)
wxEND_EVENT_TABLE()

Cartulo_Strings_Edit::Cartulo_Strings_Edit(Cartulo_Strings *strings, const wxString &title,
                                           BibString *string)
    : wxDialog(strings, wxID_ANY, title, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER),
      m_sources(strings->Sources()), m_file(strings->WritableFile()),
      m_encoding(Bib_Encoding(m_file)), m_string(string)
{
    SetFont(wxFontInfo(10));
    m_key = new wxTextCtrl(this, ID_STRING_KEY);
    m_value = new wxTextCtrl(this, ID_STRING_VALUE);
    if (string)
        Fill();
    wxFlexGridSizer *rows = Dialog_CreateRows(this);
    Dialog_AddRow(rows, this, "String Key:", m_key);
    Dialog_AddRow(rows, this, "String Value:", m_value);
    Dialog_Finish(this, rows, string ? m_value : m_key);
    m_value->SetInsertionPointEnd(); // the focus has selected all
    SetSize(strings->GetSize().x, GetSize().y);
    CentreOnParent();
}

// A value that the control can't hold stays as it is.
void Cartulo_Strings_Edit::Fill()
{
    m_key->ChangeValue(StoreText(m_string->name, m_encoding));
    m_key->Disable();
    wxString value = StoreText(m_string->value, m_encoding);
    m_value->ChangeValue(value);
    m_filled = m_value->GetValue();
    if (m_filled == value)
        return;
    m_value->SetEditable(false);
    m_value->SetToolTip(Text_LockedTip);
}

void Cartulo_Strings_Edit::Refuse(const wxString &text, wxTextCtrl *at)
{
    Box_Warn(this, Caption, text);
    Text_Focus(at);
}

// False when the user has to see to the key first.
bool Cartulo_Strings_Edit::AcceptKey(const TypedName &key, NameVerdict verdict)
{
    switch (verdict) {
    case NAME_OK:
        return true;
    case NAME_EMPTY:
        Refuse("Please enter key for new string.", m_key);
        return false;
    case NAME_MISFIT:
        Refuse(Name_MisfitText(key), m_key);
        return false;
    case NAME_BAD_CHARS:
        Box_OfferStripped(this, Caption,
                          "String  key includes invalid characters.\n" // two blanks, stands so
                          "We will remove them and continue.",
                          key, m_key);
        return false;
    case NAME_UNWRITABLE:
        Refuse("A string of this name can't be written to a BIB file.\nIt must not begin with a "
               "digit, and hold no backslash or control character.",
               m_key);
        return false;
    case NAME_TAKEN:
        Refuse("String with the same key is already defined in this BIB-file.\nPlease choose "
               "another key or use edit function to modify the string",
               m_key);
    }
    return false;
}

bool Cartulo_Strings_Edit::AcceptValue(const std::string &value)
{
    const std::string stored = m_string ? m_string->value : "";
    FieldFacts field = {};
    field.value = value;
    field.isChanged = true;
    field.label = m_key->GetValue().ToStdWstring();
    field.text = m_value->GetValue().ToStdWstring();
    field.filled = m_filled.ToStdWstring();
    field.stored = stored;
    field.textGuillemets = Value_HoldsGuillemets(stored.c_str(), m_encoding);
    field.encoding = m_encoding;
    field.sources = m_sources;
    if (!AcceptLosses(FieldCheck_Warnings(field)))
        return false;
    const char *reason = FieldCheck_Refusal(field);
    if (reason)
        Refuse(wxString("Wrong string syntax:\n\n") + reason + "\n\nFix the problem to continue.",
               m_value);
    return !reason;
}

bool Cartulo_Strings_Edit::AcceptLosses(const std::wstring &losses)
{
    if (losses.empty() || Box_Ask(this, Caption, losses + FieldCheck_Question, wxNO_DEFAULT))
        return true;
    Text_Focus(m_value);
    return false;
}

bool Cartulo_Strings_Edit::RefuseForMemory() // false
{
    Refuse("There is not enough memory for the string.", m_value);
    return false;
}

bool Cartulo_Strings_Edit::Add()
{
    TypedName key = Name_Read(m_key->GetValue().ToStdWstring().c_str(), m_encoding);
    if (!AcceptKey(key, String_CheckNewKey(m_file, key)))
        return false;
    std::string value = Value_Read(m_value->GetValue().ToStdWstring(), m_encoding);
    if (!AcceptValue(value))
        return false;
    m_isChanged = Change_AddString(m_sources->set, m_file, key.text.c_str(), value.c_str()) != 0;
    return m_isChanged || RefuseForMemory();
}

bool Cartulo_Strings_Edit::Edit()
{
    std::string value = Value_Read(m_value->GetValue().ToStdWstring(), m_encoding);
    if (m_value->GetValue() == m_filled || value == m_string->value)
        return true;
    if (!AcceptValue(value))
        return false;
    m_isChanged = Change_SetString(m_sources->set, m_file, m_string, value.c_str()) != 0;
    return m_isChanged || RefuseForMemory();
}

void Cartulo_Strings_Edit::OnOK(wxCommandEvent &event)
{
    if (m_string ? Edit() : Add())
        event.Skip(); // closes
}

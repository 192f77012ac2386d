// ui/EntryDialogs.cpp - the windows that add an entry and rename one.
#include "ui/EntryDialogs.h"

#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include "base/Companion.h"
#include "encoding/Encoding.h"
#include "session/Changes.h"
#include "session/Names.h"
#include "session/Schema.h"
#include "ui/Dialogs.h"
#include "ui/DisplayText.h"
#include "ui/TypeChoice.h"

enum { KEY_WIDTH = 280 };

// --- What both windows have ---

EntryDialog::EntryDialog(wxWindow *parent, const EntryPlace &current, const Texts &texts)
    : wxDialog(parent, wxID_ANY, texts.title, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER),
      m_current(current), m_files(Entry_WritableFiles(current.set)), m_texts(texts)
{
    SetFont(wxFontInfo(10));
    m_file = new wxChoice(this, ID_ENTRY_FILE);
    m_key = new wxTextCtrl(this, ID_ENTRY_KEY);
    m_key->SetMinSize(FromDIP(wxSize(KEY_WIDTH, -1)));
    m_type = new wxChoice(this, ID_ENTRY_TYPE);
    FillFiles();
    TypeChoice_Fill(m_type, DIALOG_ITEM);
    if (current.entry)
        TypeChoice_Select(m_type, current.entry->type);
    m_rows = Dialog_CreateRows(this);
    Dialog_AddRow(m_rows, this, texts.fileLabel, m_file);
    Dialog_AddRow(m_rows, this, texts.keyLabel, m_key);
    Dialog_AddRow(m_rows, this, "Entry Type:", m_type);
}

void EntryDialog::FillFiles()
{
    for (int file : m_files)
        m_file->Append(ShortText(
            m_file, PathText(Entry_FileLabel(m_current.set, m_files, file).c_str()), DIALOG_ITEM));
}

// The item of the current file; wxNOT_FOUND when that can't be written.
int EntryDialog::CurrentChoice() const
{
    for (size_t i = 0; m_current.file >= 0 && i < m_files.size(); ++i)
        if (m_current.set->files[m_files[i]] == m_current.set->files[m_current.file])
            return int(i);
    return wxNOT_FOUND;
}

TypedName EntryDialog::Key(const BibFile *file) const
{
    return Name_Read(m_key->GetValue().ToStdWstring().c_str(),
                     file ? Bib_Encoding(file) : Enc_Current());
}

void EntryDialog::Refuse(const wxString &text)
{
    Box_Warn(this, m_texts.caption, text);
    m_key->SetFocus();
}

bool EntryDialog::AcceptDuplicate()
{
    return Box_Ask(this, m_texts.caption, m_texts.takenElsewhere);
}

bool EntryDialog::Accept(KeyVerdict verdict, const TypedName &key)
{
    switch (verdict) {
    case KEY_OK:
    case KEY_SAME:
        return verdict == KEY_OK;
    case KEY_EMPTY:
        Refuse(m_texts.emptyKey);
        return false;
    case KEY_BAD_CHARS:
        Box_OfferStripped(this, m_texts.caption,
                          "The key includes invalid characters.\n"
                          "We will remove them from key and continue.",
                          key, m_key);
        return false;
    case KEY_MISFIT:
        Refuse(Name_MisfitText(key));
        return false;
    case KEY_UNWRITABLE:
        Refuse("An entry with this key can't be written to a BIB file.");
        return false;
    case KEY_NO_FILE:
        Refuse("I can't locate selected bibliography file.");
        return false;
    case KEY_TAKEN:
        Refuse(m_texts.takenKey);
        return false;
    case KEY_TAKEN_ELSEWHERE:
        break;
    }
    return AcceptDuplicate();
}

// --- A new entry ---

wxBEGIN_EVENT_TABLE(Cartulo_NewEntry, EntryDialog)
    EVT_BUTTON(wxID_OK, Cartulo_NewEntry::OnOK)
wxEND_EVENT_TABLE()

Cartulo_NewEntry::Cartulo_NewEntry(wxWindow *parent, const EntryPlace &current,
                                   const std::string &ini)
    : EntryDialog(parent, current,
                  {"Creating New Bibliography Entry", "Add Entry to BIB-file:", "Entry Key:",
                   "Adding New Entry", "Please enter key of the new bibliography entry.",
                   "Specified Key is already present in the BIB file.",
                   "Specified Key is already present in another BIB files.\n"
                   // Misspelt, stands so.
                   "Are you shure that you want to add duplication in your BIB-File ?"}),
      m_ini(ini)
{
    SelectFile();
    if (m_type->GetSelection() == wxNOT_FOUND && !m_type->IsEmpty())
        m_type->SetSelection(0);
    m_child = new wxCheckBox(this, ID_ENTRY_CHILD, "");
    const BibFile *file = current.file >= 0 ? current.set->files[current.file] : nullptr;
    m_child->Enable(Entry_MayBeParent(file, current.entry));
    if (m_child->IsEnabled())
        m_child->SetToolTip("The new entry refers to `" +
                            StoreText(current.entry->key, Bib_Encoding(file)) + "'.");
    Dialog_AddRow(m_rows, this, "Create 'crossref':", m_child);
    Dialog_Finish(this, m_rows, m_key);
}

// The line is logged for a file that was found, too.
void Cartulo_NewEntry::SelectFile()
{
    int current = CurrentChoice();
    if (current == wxNOT_FOUND && !m_files.empty()) {
        m_file->SetSelection(0);
        return;
    }
    m_file->SetSelection(current);
    TNSMessage("ERROR: ", "There is no editable BIB files", TNS_ERROR); // stands so
}

// -1 for none. The entry that a new one refers to has to be in the same file.
int Cartulo_NewEntry::TargetFile() const
{
    if (m_child->GetValue())
        return m_current.file;
    int item = m_file->GetSelection();
    return item == wxNOT_FOUND ? -1 : m_files[item];
}

void Cartulo_NewEntry::OnOK(wxCommandEvent &event)
{
    int file = TargetFile();
    const BibFile *target = file >= 0 ? m_current.set->files[file] : nullptr;
    TypedName key = Key(target);
    KeyVerdict verdict = Entry_CheckNewKey(m_current.set, target, key);
    if (Accept(verdict, key) && Create(file, key.text))
        event.Skip(); // closes
}

bool Cartulo_NewEntry::Create(int file, const std::string &key)
{
    BibFile *target = m_current.set->files[file];
    int index = TypeChoice_Type(m_type);
    const char *typeName = index < 0 ? "" : BibTypeTable[index];
    const bool child = m_child->GetValue();
    char section[SCHEMA_SECTION_SIZE];
    Schema_FieldSpecs(m_ini.c_str(), typeName, section, sizeof section);
    EntryType type = Entry_TypeFor(target, typeName, child ? Entry_ChildSpecs : section);
    if (!type.reason.empty()) {
        Refuse(StoreText(type.reason.c_str(), Bib_Encoding(target)));
        return false;
    }
    BibEntry *entry = Change_AddEntry(m_current.set, target, key.c_str(), type.name.c_str(),
                                      type.specs.c_str(), child ? m_current.entry : nullptr);
    if (!entry) {
        Refuse("There is not enough memory for a new entry.");
        return false;
    }
    m_changed = entry;
    return true;
}

// --- Another key ---

wxBEGIN_EVENT_TABLE(Cartulo_RenameEntry, EntryDialog)
    EVT_BUTTON(wxID_OK, Cartulo_RenameEntry::OnOK)
wxEND_EVENT_TABLE()

Cartulo_RenameEntry::Cartulo_RenameEntry(wxWindow *parent, const EntryPlace &current)
    : EntryDialog(parent, current,
                  {"Renaming Bibliography Entry", "Entry in BIB-file:", "New Key for the Entry:",
                   "Renaming Entry", "Please enter new key for the bibliography entry.",
                   "Specified New Key is already present in the BIB file.",
                   "Specified New Key is already present in another BIB files.\n"
                   // Misspelt, stands so.
                   "Are you shure that you want to add duplication in your BIB-File ?"})
{
    m_file->SetSelection(CurrentChoice());
    m_file->Disable();
    m_type->Disable();
    if (current.entry)
        m_key->ChangeValue(
            StoreText(current.entry->key, Bib_Encoding(current.set->files[current.file])));
    Dialog_Finish(this, m_rows, m_key);
}

bool Cartulo_RenameEntry::MayRename() const
{
    return m_current.entry && m_current.file >= 0 &&
           !m_current.set->files[m_current.file]->readOnly;
}

bool Cartulo_RenameEntry::Rename(BibFile *file, const std::string &key)
{
    if (!Change_RenameEntry(m_current.set, file, m_current.entry, key.c_str())) {
        Refuse("There is not enough memory for the new key.");
        return false;
    }
    m_changed = m_current.entry;
    return true;
}

// An empty key closes the window as well.
void Cartulo_RenameEntry::OnOK(wxCommandEvent &event)
{
    if (!MayRename()) {
        event.Skip();
        return;
    }
    BibFile *file = m_current.set->files[m_current.file];
    TypedName key = Key(file);
    KeyVerdict verdict = Entry_CheckRename(m_current.set, file, m_current.entry, key);
    bool renamed = Accept(verdict, key) && Rename(file, key.text);
    if (renamed || verdict == KEY_EMPTY)
        event.Skip(); // closes
}

// ui/FieldDialogs.h - the windows for a field of the entry that is edited: its value, its name.
#pragma once

#include <wx/arrstr.h>
#include <wx/dialog.h>

#include <string>

class wxComboBox;
class wxTextCtrl;
struct FieldGrid;
struct TypedName;

enum { ID_FIELD_KEY = 6001, ID_FIELD_VALUE = 6002, ID_FIELD_NEW_NAME = 6002 };

// What is wrong with the name of a field, for the user.
extern const char FieldKey_BadCharsText[];
extern const char FieldKey_TakenText[];

class Cartulo_EditField : public wxDialog
{
public:
    Cartulo_EditField(wxWindow *parent, const wxString &key, const wxString &value);

    wxString Value() const;

private:
    void OnOK(wxCommandEvent &event);

    wxTextCtrl *m_value; // child window

    wxDECLARE_EVENT_TABLE();
};

class Cartulo_RenameField : public wxDialog
{
public:
    // `grid` outlives the dialog; `proposals` are the keys of the type's fields.
    Cartulo_RenameField(wxWindow *parent, const FieldGrid *grid, const wxString &key,
                        const wxArrayString &proposals, const wxString &proposal);

    std::string NewName() const { return m_newName; } // store text; "" when nothing is to change

private:
    void OnOK(wxCommandEvent &event);
    bool Accept(const TypedName &name);

    const FieldGrid *m_grid;
    wxComboBox *m_name; // child window
    std::string m_newName;

    wxDECLARE_EVENT_TABLE();
};

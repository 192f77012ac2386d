// help/HelpFrame.cpp - the window of the help program.

#include "help/HelpFrame.h"

#include <algorithm>

#include <wx/display.h>
#include <wx/html/htmlcell.h>
#include <wx/settings.h>
#include <wx/sizer.h>
#include <wx/utils.h>

#include "help/HelpPage.h"
#include "ui/Icons.h"

enum { ID_SEARCH_TEXT = 1, VIEW_MARGIN = 12 };

wxBEGIN_EVENT_TABLE(HelpFrame, wxFrame)
    EVT_SEARCH(ID_SEARCH_TEXT, HelpFrame::OnFind)
    EVT_TEXT(ID_SEARCH_TEXT, HelpFrame::OnText)
    EVT_CHAR_HOOK(HelpFrame::OnCharHook)
    EVT_SYS_COLOUR_CHANGED(HelpFrame::OnColours)
wxEND_EVENT_TABLE()

// --- The page ---

HelpView::HelpView(wxWindow *parent) : wxHtmlWindow(parent)
{
    SetStandardFonts();
    SetBorders(FromDIP(int(VIEW_MARGIN)));
}

void HelpView::Show(const wxString &page)
{
    m_next = 0;
    SetPage(page);
}

void HelpView::OnLinkClicked(const wxHtmlLinkInfo &link)
{
    wxString address = link.GetHref();
    if (Help_IsWebAddress(address.utf8_str()))
        wxLaunchDefaultBrowser(address);
    else if (address.StartsWith("#"))
        wxHtmlWindow::OnLinkClicked(link);
}

bool HelpView::FindNext(const wxString &text)
{
    std::vector<const wxHtmlCell *> cells;
    std::vector<std::string> words;
    const wxHtmlCell *root = GetInternalRepresentation();
    for (wxHtmlTerminalCellsInterator i(root->GetFirstTerminal(), root->GetLastTerminal()); i;
         ++i) {
        cells.push_back(*i);
        words.push_back(i->ConvertToText(nullptr).Lower().utf8_string());
    }
    HelpPlace place = Help_FindText(words, text.Lower().utf8_string(), m_next);
    if (place.first < 0)
        return false;
    m_next = place.first + 1;
    ShowWords(cells[place.first], cells[place.last]);
    return true;
}

// Selects them, and scrolls so that what is around them can be read.
void HelpView::ShowWords(const wxHtmlCell *first, const wxHtmlCell *last)
{
    delete m_selection; // the base class deletes the new one
    m_selection = new wxHtmlSelection;
    m_selection->Set(first, last);
    int top, unit, y = first->GetAbsPos().y;
    GetViewStart(nullptr, &top);
    GetScrollPixelsPerUnit(nullptr, &unit);
    int height = GetClientSize().y;
    if (unit > 0 && (y < top * unit || y + first->GetHeight() > top * unit + height))
        Scroll(-1, std::max(0, y - height / 3) / unit);
    Refresh();
}

// --- The window ---

HelpFrame::HelpFrame(const std::string &manual, const std::string &notice)
    : wxFrame(nullptr, wxID_ANY, "Cartulo", wxDefaultPosition, wxDefaultSize), m_manual(manual),
      m_notice(notice)
{
    SetIcons(Icon_Program());
    wxPanel *panel = new wxPanel(this);
    m_search = new wxSearchCtrl(panel, ID_SEARCH_TEXT, "", wxDefaultPosition,
                                FromDIP(wxSize(240, -1)), wxTE_PROCESS_ENTER);
    m_search->SetDescriptiveText("Find");
    m_search->SetToolTip("A text to look for (Ctrl+F); Enter or F3 for the next place");
    m_answer = new wxStaticText(panel, wxID_ANY, "");
    m_view = new HelpView(panel);

    wxBoxSizer *bar = new wxBoxSizer(wxHORIZONTAL);
    bar->Add(m_search, wxSizerFlags().CenterVertical().Border());
    bar->Add(m_answer, wxSizerFlags(1).CenterVertical().Border());
    wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
    column->Add(bar, wxSizerFlags().Expand());
    column->Add(m_view, wxSizerFlags(1).Expand());
    panel->SetSizer(column);

    m_view->SetRelatedFrame(this, "%s");
    ShowPage();
    SetMinSize(FromDIP(wxSize(360, 240)));
    wxSize size = FromDIP(wxSize(760, 680));
    size.DecTo(wxDisplay(this).GetClientArea().GetSize());
    SetSize(size);
    m_view->SetFocus(); // the arrow keys scroll at once
}

static std::string ColourText(wxSystemColour colour)
{
    return wxSystemSettings::GetColour(colour).GetAsString(wxC2S_HTML_SYNTAX).utf8_string();
}

void HelpFrame::ShowPage()
{
    HelpColours colours = {ColourText(wxSYS_COLOUR_LISTBOX), ColourText(wxSYS_COLOUR_LISTBOXTEXT),
                           ColourText(wxSYS_COLOUR_HOTLIGHT)};
    m_view->Show(wxString::FromUTF8(Help_Page(m_manual, colours, m_notice)));
}

void HelpFrame::FindNext()
{
    wxString text = m_search->GetValue();
    bool found = !text.empty() && m_view->FindNext(text);
    m_answer->SetLabel(found || text.empty() ? "" : "The text is not in the manual.");
    if (found)
        m_view->SetFocus(); // the selection is hardly legible elsewhere
}

void HelpFrame::OnFind(wxCommandEvent &)
{
    FindNext();
}

void HelpFrame::OnText(wxCommandEvent &)
{
    m_answer->SetLabel("");
}

// Enter goes on from the page, too.
static bool IsFindNext(int key, bool control, bool inView)
{
    return key == WXK_F3 || (control && key == 'G') ||
           (inView && (key == WXK_RETURN || key == WXK_NUMPAD_ENTER));
}

void HelpFrame::OnCharHook(wxKeyEvent &event)
{
    bool control = event.GetModifiers() == wxMOD_CONTROL;
    int key = event.GetKeyCode();
    if (key == WXK_ESCAPE || (control && key == 'W'))
        Close();
    else if (control && key == 'F') {
        m_search->SetFocus();
        m_search->SelectAll();
    } else if (IsFindNext(key, control, FindFocus() == m_view))
        FindNext();
    else
        event.Skip();
}

// The page holds the colours of the theme that was.
void HelpFrame::OnColours(wxSysColourChangedEvent &event)
{
    ShowPage();
    event.Skip();
}

// help/HelpFrame.h - the window of the help program.
#pragma once

#include <vector>

#include <wx/frame.h>
#include <wx/html/htmlwin.h>
#include <wx/srchctrl.h>
#include <wx/stattext.h>

// A page whose words can be found. Addresses of the web open in the browser.
class HelpView : public wxHtmlWindow
{
public:
    explicit HelpView(wxWindow *parent);

    void Show(const wxString &page);
    bool FindNext(const wxString &text); // shows the next place; false when there is none

private:
    void OnLinkClicked(const wxHtmlLinkInfo &link) override;
    void ShowWords(const wxHtmlCell *first, const wxHtmlCell *last);

    int m_next = 0; // the word after the last place found
};

class HelpFrame : public wxFrame
{
public:
    HelpFrame(const std::string &manual, const std::string &notice);

private:
    void ShowPage();
    void FindNext();

    void OnFind(wxCommandEvent &event);
    void OnText(wxCommandEvent &event);
    void OnCharHook(wxKeyEvent &event);
    void OnColours(wxSysColourChangedEvent &event);

    std::string m_manual, m_notice;
    wxSearchCtrl *m_search = nullptr; // the children belong to the frame
    wxStaticText *m_answer = nullptr;
    HelpView *m_view = nullptr;

    wxDECLARE_EVENT_TABLE();
};

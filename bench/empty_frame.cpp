// bench/empty_frame.cpp - the least that a program of the toolkit can show: a frame with an empty
// panel. Says on standard error when the panel is painted for the first time.
#include <cstdio>

#include <wx/app.h>
#include <wx/dcclient.h>
#include <wx/frame.h>
#include <wx/panel.h>

class EmptyFrame : public wxApp
{
public:
    bool OnInit() override
    {
        wxFrame *frame = new wxFrame(nullptr, wxID_ANY, "Empty");
        wxPanel *panel = new wxPanel(frame);
        panel->Bind(wxEVT_PAINT, &EmptyFrame::OnPaint, this);
        frame->Show();
        return true;
    }

private:
    void OnPaint(wxPaintEvent &event)
    {
        if (!m_isPainted)
            fputs("INFO: EmptyFrame::OnPaint First\n", stderr);
        m_isPainted = true;
        event.Skip();
    }

    bool m_isPainted = false;
};

wxIMPLEMENT_APP(EmptyFrame);

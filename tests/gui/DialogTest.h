// tests/gui/DialogTest.h - what tests look at and do in the program's windows.
#pragma once

#include <functional>
#include <vector>

#include <wx/app.h>
#include <wx/choice.h>
#include <wx/stattext.h>

#include "tests/gui/GuiTest.h"

template <class Control> Control *Find(wxDialog &dialog, int id)
{
    Control *control = dynamic_cast<Control *>(dialog.FindWindow(id));
    EXPECT_TRUE(control) << id;
    return control;
}

inline std::vector<wxString> Items(const wxItemContainerImmutable *container)
{
    std::vector<wxString> items;
    for (unsigned i = 0; i < container->GetCount(); ++i)
        items.push_back(container->GetString(i));
    return items;
}

inline std::vector<wxString> Labels(const wxDialog &dialog)
{
    std::vector<wxString> labels;
    for (wxWindow *child : dialog.GetChildren())
        if (wxStaticText *text = dynamic_cast<wxStaticText *>(child))
            labels.push_back(text->GetLabelText());
    return labels;
}

// No control is smaller than its text and picture need.
inline void ExpectRoom(const wxDialog &dialog)
{
    for (wxWindow *child : dialog.GetChildren()) {
        EXPECT_GE(child->GetSize().x, child->GetBestSize().x) << child->GetLabel();
        EXPECT_GE(child->GetSize().y, child->GetBestSize().y) << child->GetLabel();
    }
}

inline void PressButton(wxDialog &dialog, int id)
{
    wxCommandEvent event(wxEVT_BUTTON, id);
    event.SetEventObject(dialog.FindWindow(id));
    dialog.ProcessWindowEvent(event);
}

// As the user does, who sees the same item again when it is chosen already.
inline void ChooseItem(wxDialog &dialog, int id, int item)
{
    wxChoice *choice = Find<wxChoice>(dialog, id);
    choice->SetSelection(item);
    wxCommandEvent event(wxEVT_CHOICE, id);
    event.SetEventObject(choice);
    choice->ProcessWindowEvent(event);
}

// Does what opens a window that is really shown; `steps` run once it has come up.
template <class Dialog>
void ShowDialog(const std::function<void()> &open, const std::function<void(Dialog &)> &steps)
{
    AllowDialogs allow;
    bool ran = false;
    wxTheApp->CallAfter([&] {
        Dialog *dialog = nullptr;
        ASSERT_TRUE(WaitFor([&] {
            for (wxWindow *window : wxTopLevelWindows)
                if (Dialog *one = dynamic_cast<Dialog *>(window))
                    dialog = one;
            return dialog && dialog->IsShownOnScreen() && dialog->IsActive();
        }));
        ran = true;
        steps(*dialog);
    });
    open();
    EXPECT_TRUE(ran);
}

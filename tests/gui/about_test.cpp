// tests/gui/about_test.cpp - the About box.
#include "app/AboutDlg.h"

#include <algorithm>
#include <regex>

#include <wx/app.h>
#include <wx/button.h>
#include <wx/image.h>
#include <wx/settings.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

#include "tests/gui/GuiTest.h"
#include "tests/support/DataFolder.h"
#include "ui/Colours.h"
#include "ui/PanelRules.h"

namespace
{

std::string FirstMatch(const char *path, const char *pattern)
{
    std::ifstream stream(path);
    for (std::string line; std::getline(stream, line);) {
        if (std::regex_search(line, std::regex(pattern)))
            return line;
    }
    return "";
}

} // namespace

class About : public testing::Test
{
protected:
    // The controls from top to bottom.
    static std::vector<wxWindow *> Column(const AboutDlg &about)
    {
        const wxWindowList &children = about.GetChildren();
        std::vector<wxWindow *> column(children.begin(), children.end());
        std::sort(column.begin(), column.end(), [](const wxWindow *a, const wxWindow *b) {
            return a->GetPosition().y < b->GetPosition().y;
        });
        return column;
    }

    static std::vector<wxString> Texts(const AboutDlg &about)
    {
        std::vector<wxString> texts;
        for (const wxWindow *window : Column(about))
            texts.push_back(window->GetLabel());
        return texts;
    }

    static wxStaticBitmap *Logo(const AboutDlg &about)
    {
        return dynamic_cast<wxStaticBitmap *>(Column(about).at(0));
    }

    static wxStaticText *Name(const AboutDlg &about)
    {
        for (wxWindow *window : Column(about)) {
            if (window->GetLabel() == "Cartulo")
                return dynamic_cast<wxStaticText *>(window);
        }
        return nullptr;
    }

    DataFolder folder; // what the user has of his own
};

TEST_F(About, SaysWhatTheProgramIs)
{
    AboutDlg about(nullptr);
    EXPECT_EQ("About ...", about.GetTitle());
    EXPECT_EQ(wxDEFAULT_DIALOG_STYLE, about.GetWindowStyle() & wxDEFAULT_DIALOG_STYLE);
    EXPECT_TRUE(Logo(about));
    std::vector<wxString> texts = Texts(about);
    ASSERT_EQ(7u, texts.size());
    EXPECT_EQ("Cartulo", texts[1]);
    EXPECT_EQ("Desktop editor for BibTeX databases", texts[2]);
    EXPECT_TRUE(texts[3].StartsWith("Version " CARTULO_VERSION ", ")) << texts[3];
    EXPECT_TRUE(std::regex_search(texts[3].ToStdString(), std::regex(", 20\\d\\d-\\d\\d-\\d\\d$")));
    EXPECT_EQ(FirstMatch(TEST_DATA "/../../LICENSE", "^Copyright"), texts[4]);
    EXPECT_TRUE(texts[5].Contains(FirstMatch(TEST_DATA "/../../LICENSE", "License$"))) << texts[5];
    EXPECT_EQ("Close", texts[6]);
}

TEST_F(About, CentresItsLines)
{
    AboutDlg about(nullptr);
    int middle = about.GetClientSize().x / 2;
    for (const wxWindow *window : Column(about)) {
        wxRect rect = window->GetRect();
        EXPECT_NEAR(middle, rect.x + rect.width / 2, 1) << window->GetLabel();
        EXPECT_GE(rect.x, about.FromDIP(12));
        EXPECT_LE(rect.GetBottom(), about.GetClientSize().y - about.FromDIP(12));
    }
}

TEST_F(About, HasTheNameInBold)
{
    AboutDlg about(nullptr);
    EXPECT_EQ(10, about.GetFont().GetPointSize());
    EXPECT_EQ(wxFONTWEIGHT_NORMAL, about.GetFont().GetWeight());
    ASSERT_TRUE(Name(about));
    EXPECT_EQ(about.GetFont().Bold(), Name(about)->GetFont());
}

// Runs on a light and on a dark desktop.
TEST_F(About, HasReadableColours)
{
    auto of = [](const wxColour &colour) {
        return Colour{colour.Red(), colour.Green(), colour.Blue()};
    };
    AboutDlg about(nullptr);
    for (const wxWindow *window : Column(about)) {
        EXPECT_GE(
            Colour_Contrast(of(window->GetForegroundColour()), of(window->GetBackgroundColour())),
            4.5)
            << window->GetLabel();
    }
    ASSERT_TRUE(Name(about));
    if (!wxSystemSettings::GetAppearance().IsUsingDarkBackground()) {
        EXPECT_EQ(wxColour(128, 0, 128), Name(about)->GetForegroundColour());
    }
}

TEST_F(About, DoesWithoutALogo)
{
    folder.Write("cartulo/Cartulo.svg", "damaged"); // hides the program's own
    AboutDlg about(nullptr);
    EXPECT_FALSE(Logo(about));
    EXPECT_EQ("Cartulo", Texts(about).at(0));
    EXPECT_EQ(6u, Texts(about).size());
}

TEST_F(About, ShowsTheLogoOfABmpWithoutItsGrey)
{
    wxImage image(128, 128);
    image.SetRGB(wxRect(0, 0, 64, 128), 192, 192, 192);
    image.SetRGB(wxRect(64, 0, 64, 128), 0, 0, 200);
    ASSERT_TRUE(image.SaveFile(folder.Path("cartulo/Cartulo.bmp"), wxBITMAP_TYPE_BMP));
    AboutDlg about(nullptr);
    ASSERT_TRUE(Logo(about));
    wxImage shown = Logo(about)->GetBitmap().ConvertToImage();
    ASSERT_TRUE(shown.HasAlpha());
    EXPECT_EQ(wxSize(128, 128), Logo(about)->GetBestSize());
    wxSize size = shown.GetSize(); // larger on sharp screens
    EXPECT_EQ(0, shown.GetAlpha(size.x / 4, size.y / 2));
    EXPECT_EQ(255, shown.GetAlpha(size.x * 3 / 4, size.y / 2));
    EXPECT_EQ(200, shown.GetBlue(size.x * 3 / 4, size.y / 2));
}

// The box as a user meets it.
class OpenAbout : public About
{
protected:
    // Shows the box, does `action` once its button has the focus, and returns how the box ended:
    // wxID_NONE when it did not.
    static int Show(const std::function<void(AboutDlg *)> &action)
    {
        AllowDialogs allow;
        AboutDlg about(nullptr);
        wxTheApp->CallAfter([&] {
            EXPECT_TRUE(WaitForKeys(about.FindWindow(wxID_CANCEL)));
            action(&about);
            if (!WaitFor([&] { return !about.IsModal(); }))
                about.EndModal(wxID_NONE);
        });
        return about.ShowModal();
    }
};

TEST_F(OpenAbout, IsClosedByEsc)
{
    EXPECT_EQ(wxID_CANCEL, Show([](AboutDlg *about) { SendKey(about, WXK_ESCAPE); }));
}

TEST_F(OpenAbout, IsClosedByEnter)
{
    EXPECT_EQ(wxID_CANCEL, Show([](AboutDlg *about) { SendKey(about, WXK_RETURN); }));
}

TEST_F(OpenAbout, IsClosedByItsButton)
{
    EXPECT_EQ(wxID_CANCEL, Show([](AboutDlg *about) { Click(about->FindWindow(wxID_CANCEL)); }));
}

TEST_F(OpenAbout, IsClosedByTheWindowManager)
{
    EXPECT_EQ(wxID_CANCEL, Show([](AboutDlg *about) { about->Close(); }));
}

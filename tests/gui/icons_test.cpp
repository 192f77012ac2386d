// tests/gui/icons_test.cpp - pictures of tools, and their buttons.
#include "ui/Icons.h"

#include <cstring>

#include <wx/frame.h>
#include <wx/image.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/textctrl.h>

#include "tests/gui/GuiTest.h"
#include "tests/support/DataFolder.h"
#include "ui/Colours.h"
#include "ui/PanelRules.h"

namespace
{

const Colour LightBar = {0xf6, 0xf5, 0xf4}, DarkBar = {0x35, 0x35, 0x35};

const char *const Tools[] = {
    "document-save",   "script-edit", "accessories-text-editor",
    "insert-tex-cite", "list-add",    "list-rename",
    "list-remove",     "list-edit",   "Warning",
    "help-contents",   "help-about",  "document-open",
};

wxImage Draw(const wxBitmapBundle &picture, int size)
{
    wxImage image = picture.GetBitmap(wxSize(size, size)).ConvertToImage();
    if (!image.HasAlpha())
        image.InitAlpha();
    return image;
}

int AlphaAt(const wxImage &image, int x, int y)
{
    return image.GetAlpha(x, y);
}

// How a pixel looks on a background.
Colour Shown(const wxImage &image, int x, int y, Colour back)
{
    int alpha = image.GetAlpha(x, y);
    auto mix = [alpha](int fore, int behind) {
        return static_cast<unsigned char>((fore * alpha + behind * (255 - alpha)) / 255);
    };
    return {mix(image.GetRed(x, y), back.red), mix(image.GetGreen(x, y), back.green),
            mix(image.GetBlue(x, y), back.blue)};
}

// The part of the picture's area that stands out from the background, in percent.
int ClearPart(const wxImage &image, Colour back)
{
    int clear = 0;
    for (int y = 0; y < image.GetHeight(); ++y) {
        for (int x = 0; x < image.GetWidth(); ++x)
            clear += Colour_Contrast(Shown(image, x, y, back), back) >= 3;
    }
    return 100 * clear / (image.GetWidth() * image.GetHeight());
}

bool IsSame(const wxImage &a, const wxImage &b)
{
    size_t count = size_t(a.GetWidth()) * a.GetHeight();
    return a.GetSize() == b.GetSize() && memcmp(a.GetData(), b.GetData(), 3 * count) == 0 &&
           memcmp(a.GetAlpha(), b.GetAlpha(), count) == 0;
}

// The left half in one colour, the right half in another.
wxImage TwoColours(int size, const wxColour &left, const wxColour &right)
{
    wxImage image(size, size);
    image.SetRGB(wxRect(0, 0, size / 2, size), left.Red(), left.Green(), left.Blue());
    image.SetRGB(wxRect(size / 2, 0, size - size / 2, size), right.Red(), right.Green(),
                 right.Blue());
    return image;
}

const wxColour Grey(192, 192, 192), AlmostGrey(192, 192, 193), Red(200, 0, 0);

} // namespace

// Pictures of a user's own, which come first.
class Icons : public testing::Test
{
protected:
    std::string Own(const std::string &name) const { return folder.Path("cartulo/icons/" + name); }

    void Save(const std::string &name, const wxImage &image, wxBitmapType type) const
    {
        ASSERT_TRUE(image.SaveFile(Own(name), type));
    }

    DataFolder folder;
};

TEST_F(Icons, StandOutFromLightAndDarkToolBars)
{
    for (const char *name : Tools) {
        wxImage box = Draw(Icon_Load("no such tool", 16), 16);
        EXPECT_FALSE(IsSame(box, Draw(Icon_Load(name, 16), 16))) << name << " is missing";
        for (int size : {16, 20, 24, 28, 32, 64}) {
            wxImage image = Draw(Icon_Load(name, size), size);
            EXPECT_EQ(wxSize(size, size), image.GetSize()) << name;
            EXPECT_GE(ClearPart(image, LightBar), 12) << name << " " << size;
            EXPECT_GE(ClearPart(image, DarkBar), 12) << name << " " << size;
        }
    }
}

TEST_F(Icons, AreDifferent)
{
    for (const char *one : Tools) {
        for (const char *other : Tools) {
            EXPECT_EQ(one == other,
                      IsSame(Draw(Icon_Load(one, 16), 16), Draw(Icon_Load(other, 16), 16)))
                << one << " " << other;
        }
    }
}

TEST_F(Icons, HaveMoreDetailOnScreensWithMorePixels)
{
    wxBitmapBundle icon = Icon_Load("help-about", 16);
    EXPECT_EQ(wxSize(16, 16), icon.GetDefaultSize());
    EXPECT_EQ(wxSize(32, 32), icon.GetPreferredBitmapSizeAtScale(2));
    wxImage stretched = Draw(icon, 16).Scale(32, 32, wxIMAGE_QUALITY_NEAREST);
    EXPECT_FALSE(IsSame(stretched, Draw(icon, 32)));
}

TEST_F(Icons, KeepTheirColourAtSoftEdges)
{
    std::string path =
        folder.Write("edge.svg", R"(<svg xmlns="http://www.w3.org/2000/svg" width="8" height="8">)"
                                 R"(<path fill="#fff" d="M0 0h7.5v8H0z"/></svg>)");
    wxImage image = Draw(Icon_LoadFile(path.c_str(), wxSize(8, 8)), 8);
    EXPECT_EQ(255, AlphaAt(image, 3, 4));
    EXPECT_NEAR(128, AlphaAt(image, 7, 4), 16);
    EXPECT_GE(image.GetRed(7, 4), 250);
}

TEST_F(Icons, OfTheUserComeFirst)
{
    Save("list-add.png", TwoColours(16, Red, Red), wxBITMAP_TYPE_PNG);
    wxImage image = Draw(Icon_Load("list-add", 16), 16);
    EXPECT_EQ(200, image.GetRed(1, 1));
    EXPECT_EQ(255, AlphaAt(image, 1, 1));
}

TEST_F(Icons, AreTransparentInABmpWhereItIsGrey)
{
    Save("tool.bmp", TwoColours(16, Grey, Red), wxBITMAP_TYPE_BMP);
    wxImage image = Draw(Icon_Load("tool", 16), 16);
    EXPECT_EQ(0, AlphaAt(image, 3, 8));
    EXPECT_EQ(255, AlphaAt(image, 12, 8));
    EXPECT_EQ(200, image.GetRed(12, 8));
}

TEST_F(Icons, AreTransparentWhateverTheCaseOfTheEnding)
{
    for (const char *name : {"tool.BMP", "tool.Bmp"}) {
        Save(name, TwoColours(16, Grey, Red), wxBITMAP_TYPE_BMP);
        wxImage image = Draw(Icon_LoadFile(Own(name).c_str(), wxSize(16, 16)), 16);
        EXPECT_EQ(0, AlphaAt(image, 3, 8)) << name;
        EXPECT_EQ(255, AlphaAt(image, 12, 8)) << name;
    }
}

TEST_F(Icons, AreOpaqueWhereTheGreyIsAnother)
{
    Save("tool.bmp", TwoColours(16, AlmostGrey, Red), wxBITMAP_TYPE_BMP);
    EXPECT_EQ(255, AlphaAt(Draw(Icon_Load("tool", 16), 16), 3, 8));
}

TEST_F(Icons, AreOpaqueWhereAnotherFormatIsGrey)
{
    Save("tool.png", TwoColours(16, Grey, Red), wxBITMAP_TYPE_PNG);
    wxImage image = Draw(Icon_Load("tool", 16), 16);
    EXPECT_EQ(255, AlphaAt(image, 3, 8));
    EXPECT_EQ(192, image.GetRed(3, 8));
}

TEST_F(Icons, AreTransparentWhereAnXpmIs)
{
    folder.Write("cartulo/icons/tool.xpm", "/* XPM */\nstatic char *tool[] = {\n\"2 1 2 1\",\n"
                                           "\"  c None\",\n\". c #C80000\",\n\" .\"};\n");
    wxBitmapBundle icon = Icon_LoadFile(Own("tool.xpm").c_str(), wxSize(2, 1));
    ASSERT_TRUE(icon.IsOk());
    wxImage image = icon.GetBitmap(wxSize(2, 1)).ConvertToImage();
    ASSERT_TRUE(image.HasAlpha());
    EXPECT_EQ(0, AlphaAt(image, 0, 0));
    EXPECT_EQ(255, AlphaAt(image, 1, 0));
    EXPECT_EQ(200, image.GetRed(1, 0));
}

TEST_F(Icons, ShrinkToTheSizeAndKeepTheOriginalForSharpScreens)
{
    Save("tool.bmp", TwoColours(32, Grey, Red), wxBITMAP_TYPE_BMP);
    wxBitmapBundle icon = Icon_Load("tool", 16);
    EXPECT_EQ(wxSize(16, 16), icon.GetDefaultSize());
    EXPECT_EQ(wxSize(32, 32), icon.GetPreferredBitmapSizeAtScale(2));
    wxImage image = Draw(icon, 16);
    EXPECT_EQ(0, AlphaAt(image, 2, 8));
    EXPECT_EQ(255, AlphaAt(image, 13, 8));
    EXPECT_EQ(200, image.GetRed(13, 8));
}

TEST_F(Icons, GrowToTheSize)
{
    Save("tool.png", TwoColours(8, Red, Red), wxBITMAP_TYPE_PNG);
    EXPECT_EQ(wxSize(16, 16), Icon_Load("tool", 16).GetDefaultSize());
}

TEST_F(Icons, KeepTheirShape)
{
    Save("tool.png", TwoColours(64, Red, Red).Scale(64, 32), wxBITMAP_TYPE_PNG);
    wxBitmapBundle icon = Icon_LoadFile(Own("tool.png").c_str(), wxSize(16, 16));
    EXPECT_EQ(wxSize(16, 8), icon.GetDefaultSize());
}

TEST_F(Icons, LoadFromFoldersWithForeignNames)
{
    for (const char *name : {"M\xc3\xbcller", "K\xf6rner"}) { // UTF-8 and another encoding
        std::filesystem::create_directories(folder.Path(name));
        Save("tool.png", TwoColours(16, Red, Red), wxBITMAP_TYPE_PNG);
        std::string pixels = folder.Path(std::string(name) + "/tool.png");
        std::string drawing = folder.Path(std::string(name) + "/tool.svg");
        std::filesystem::copy_file(Own("tool.png"), pixels);
        folder.Write(std::string(name) + "/tool.svg",
                     R"(<svg width="8" height="8"><path d="M0 0h8v8H0z"/></svg>)");
        EXPECT_TRUE(Icon_LoadFile(pixels.c_str(), wxSize(16, 16)).IsOk()) << name;
        EXPECT_TRUE(Icon_LoadFile(drawing.c_str(), wxSize(16, 16)).IsOk()) << name;
    }
}

TEST_F(Icons, AreNoneForNoFile)
{
    EXPECT_FALSE(Icon_LoadFile(nullptr, wxSize(16, 16)).IsOk());
    EXPECT_FALSE(Icon_LoadFile("", wxSize(16, 16)).IsOk());
    EXPECT_FALSE(Icon_LoadFile(Own("none.svg").c_str(), wxSize(16, 16)).IsOk());
    EXPECT_FALSE(Icon_LoadFile(Own("none.png").c_str(), wxSize(16, 16)).IsOk());
    EXPECT_FALSE(Icon_LoadFile(folder.Path().c_str(), wxSize(16, 16)).IsOk());
}

TEST_F(Icons, AreNoneForDamagedFiles)
{
    const char *const texts[] = {"", "no picture", "<svg", "<svg></svg>",
                                 R"(<svg width="16" height="16"></svg>)"};
    for (const char *text : texts) {
        for (const char *ending : {"svg", "png", "bmp", "xpm"}) {
            std::string path = folder.Write(std::string("damaged.") + ending, text);
            EXPECT_FALSE(Icon_LoadFile(path.c_str(), wxSize(16, 16)).IsOk()) << path << text;
        }
    }
}

TEST_F(Icons, ThatAreMissingOrDamagedShowABox)
{
    folder.Write("cartulo/icons/damaged.svg", "<svg></svg>");
    Save("invisible.bmp", TwoColours(16, Grey, Grey), wxBITMAP_TYPE_BMP);
    const char *const names[] = {"no such tool", "damaged", "invisible", nullptr};
    for (const char *name : names) {
        wxImage image = Draw(Icon_Load(name, 16), 16);
        EXPECT_GE(ClearPart(image, LightBar), 12) << (name ? name : "null");
        EXPECT_GE(ClearPart(image, DarkBar), 12) << (name ? name : "null");
        wxImage fallback = Draw(Icon_Load(name, 16, "no such picture"), 16);
        EXPECT_TRUE(IsSame(image, fallback)) << (name ? name : "null");
    }
}

TEST_F(Icons, ThatAreMissingShowTheDesktopsPicture)
{
    wxBitmapBundle desktops =
        wxArtProvider::GetBitmapBundle(wxART_FILE_SAVE, wxART_TOOLBAR, wxSize(16, 16));
    ASSERT_TRUE(desktops.IsOk());
    EXPECT_TRUE(IsSame(Draw(desktops, 16), Draw(Icon_Load("none", 16, wxART_FILE_SAVE), 16)));
    EXPECT_FALSE(IsSame(Draw(desktops, 16), Draw(Icon_Load("list-add", 16, wxART_FILE_SAVE), 16)));
}

TEST_F(Icons, OfTheProgramExistInManySizes)
{
    wxIconBundle icons = Icon_Program();
    for (int size : {16, 24, 32, 48, 64, 128}) {
        wxIcon icon = icons.GetIconOfExactSize(wxSize(size, size));
        ASSERT_TRUE(icon.IsOk()) << size;
        wxBitmap bitmap;
        bitmap.CopyFromIcon(icon);
        wxImage image = bitmap.ConvertToImage();
        EXPECT_GE(ClearPart(image, LightBar), 30) << size;
        EXPECT_GE(ClearPart(image, DarkBar), 30) << size;
    }
}

TEST_F(Icons, OfTheProgramAreNoneWhenMissing)
{
    folder.Write("cartulo/icons/cartulo.svg", "<svg></svg>"); // hides the program's own
    EXPECT_TRUE(Icon_Program().IsEmpty());
}

// Two text fields, and a button between them.
class BitmapButton : public testing::Test
{
protected:
    void SetUp() override
    {
        m_frame = new wxFrame(nullptr, wxID_ANY, "Buttons");
        wxPanel *panel = new wxPanel(m_frame);
        before = new wxTextCtrl(panel, wxID_ANY);
        button = new xBitmapButton(panel, wxID_ANY, "&Delete", "list-remove");
        after = new wxTextCtrl(panel, wxID_ANY);
        button->Bind(wxEVT_BUTTON, [this](wxCommandEvent &) { ++pressed; });
        wxBoxSizer *column = new wxBoxSizer(wxVERTICAL);
        for (wxWindow *window : {static_cast<wxWindow *>(before), static_cast<wxWindow *>(button),
                                 static_cast<wxWindow *>(after)})
            column->Add(window);
        panel->SetSizer(column);
        m_frame->Show();
        before->SetFocus();
        ASSERT_TRUE(WaitForKeys(before));
        ASSERT_TRUE(WaitFor([this] { return IsDrawn(button); }));
    }
    void TearDown() override
    {
        m_frame->Destroy();
        DeleteClosedWindows();
    }

    wxTextCtrl *before = nullptr, *after = nullptr; // children of the frame
    xBitmapButton *button = nullptr;                // likewise
    int pressed = 0;

private:
    static bool IsDrawn(wxWindow *window)
    {
        return window->IsShownOnScreen() && window->GetSize().y > 10;
    }

    wxFrame *m_frame = nullptr; // destroys itself
};

TEST_F(BitmapButton, FiresOnAClickAndLeavesTheFocusAlone)
{
    Click(button);
    ASSERT_TRUE(WaitFor([this] { return pressed == 1; }));
    EXPECT_TRUE(before->HasFocus());
    SendText(before, "x");
    EXPECT_TRUE(WaitFor([this] { return before->GetValue() == "x"; }));
    EXPECT_EQ(1, pressed);
}

TEST_F(BitmapButton, IsPassedOverByTab)
{
    SendKey(before, WXK_TAB);
    EXPECT_TRUE(WaitFor([this] { return after->HasFocus(); }));
    SendKey(after, WXK_TAB, wxMOD_SHIFT);
    EXPECT_TRUE(WaitFor([this] { return before->HasFocus(); }));
    EXPECT_EQ(0, pressed);
}

TEST_F(BitmapButton, HasItsLabelAndAPicture)
{
    EXPECT_EQ("&Delete", button->GetLabel());
    ASSERT_TRUE(button->GetBitmap().IsOk());
    EXPECT_EQ(16, button->GetBitmap().GetHeight());
}

TEST_F(BitmapButton, HasOnlyItsLabelWithoutAnIcon)
{
    for (const char *icon : {static_cast<const char *>(nullptr), "", "no such tool"}) {
        xBitmapButton plain(button->GetParent(), wxID_ANY, "Done", icon);
        EXPECT_EQ("Done", plain.GetLabel());
        EXPECT_FALSE(plain.GetBitmap().IsOk());
    }
}

TEST_F(BitmapButton, IsNeverWithoutBoth)
{
    xBitmapButton bare(button->GetParent(), wxID_ANY, "", "no such tool");
    EXPECT_TRUE(bare.GetBitmap().IsOk());
}

// ui/Icons.cpp - pictures of the tools and of the program, and buttons that show them.
#include "ui/Icons.h"

#include <algorithm>
#include <cstdlib>

#include <wx/filename.h>
#include <wx/image.h>

#include "base/Companion.h"

enum { BUTTON_ICON_SIZE = 16, BUTTON_GAP = 4, PROGRAM_ICON_SIZE = 48 };

// What stands for a tool whose picture is nowhere.
static const char MISSING[] =
    R"(<svg xmlns="http://www.w3.org/2000/svg" width="16" height="16" viewBox="0 0 16 16">
<path fill="#858585" d="M1 1h14v14H1z"/><path fill="#fff" d="M3 3h10v10H3z"/></svg>)";

static bool HasEnding(const wxString &path, const char *ending)
{
    return wxFileName(path).GetExt().IsSameAs(ending, false);
}

static void MakeTransparent(wxImage *image, unsigned char red, unsigned char green,
                            unsigned char blue)
{
    if (!image->HasAlpha())
        image->InitAlpha();
    unsigned char *colour = image->GetData();
    unsigned char *alpha = image->GetAlpha();
    unsigned char *end = alpha + size_t(image->GetWidth()) * image->GetHeight();
    for (; alpha < end; ++alpha, colour += 3) {
        if (colour[0] == red && colour[1] == green && colour[2] == blue)
            *alpha = wxIMAGE_ALPHA_TRANSPARENT;
    }
}

static wxImage ScaleToFit(const wxImage &image, wxSize size)
{
    double scale = std::min(double(size.x) / image.GetWidth(), double(size.y) / image.GetHeight());
    return image.Scale(std::max(1, wxRound(image.GetWidth() * scale)),
                       std::max(1, wxRound(image.GetHeight() * scale)), wxIMAGE_QUALITY_HIGH);
}

// The original is kept beside a reduced copy, for screens with more pixels.
static wxBitmapBundle LoadPixels(const wxString &path, wxSize size)
{
    wxImage image;
    if (!image.LoadFile(path))
        return {};
    if (HasEnding(path, "bmp"))
        MakeTransparent(&image, 192, 192, 192);
    else if (image.HasMask() && !image.HasAlpha())
        image.InitAlpha(); // a mask does not survive smooth scaling
    wxImage fitting = ScaleToFit(image, size);
    if (image.GetWidth() <= fitting.GetWidth())
        return wxBitmapBundle::FromImage(fitting);
    return wxBitmapBundle::FromBitmaps(wxBitmap(fitting), wxBitmap(image));
}

// Whether the toolkit's SVG pictures have their colours multiplied by the transparency already when
// they are drawn, which multiplies again and makes every soft edge dark.
static bool SvgEdgesAreDark()
{
    static const char HALF_WHITE[] =
        R"(<svg xmlns="http://www.w3.org/2000/svg" width="8" height="8" viewBox="0 0 8 8">
<path fill="#fff" d="M0 0h7.5v8H0z"/></svg>)";
    wxBitmapBundle probe = wxBitmapBundle::FromSVG(HALF_WHITE, wxSize(8, 8));
    wxImage image = probe.GetBitmap(wxSize(8, 8)).ConvertToImage();
    return image.HasAlpha() && image.GetRed(7, 4) < 250;
}

static void DivideByAlpha(wxImage *image)
{
    unsigned char *colour = image->GetData();
    const unsigned char *alpha = image->GetAlpha();
    const unsigned char *end = alpha + size_t(image->GetWidth()) * image->GetHeight();
    for (; alpha < end; ++alpha, colour += 3) {
        for (int i = 0; *alpha > 0 && i < 3; ++i)
            colour[i] = static_cast<unsigned char>(std::min(255, colour[i] * 255 / *alpha));
    }
}

namespace
{

// An SVG picture of the toolkit, with clean edges.
class CleanSvg : public wxBitmapBundleImpl
{
public:
    explicit CleanSvg(const wxBitmapBundle &svg) : m_svg(svg) {}

    wxSize GetDefaultSize() const override { return m_svg.GetDefaultSize(); }
    wxSize GetPreferredBitmapSizeAtScale(double scale) const override
    {
        return m_svg.GetPreferredBitmapSizeAtScale(scale);
    }
    wxBitmap GetBitmap(const wxSize &size) override
    {
        wxImage image = m_svg.GetBitmap(size).ConvertToImage();
        if (!image.HasAlpha())
            return m_svg.GetBitmap(size);
        DivideByAlpha(&image);
        return wxBitmap(image);
    }

private:
    wxBitmapBundle m_svg;
};

} // namespace

static wxBitmapBundle LoadSvg(const wxString &path, wxSize size)
{
    static const bool dark = SvgEdgesAreDark();
    wxBitmapBundle svg = wxBitmapBundle::FromSVGFile(path, size);
    return svg.IsOk() && dark ? wxBitmapBundle::FromImpl(new CleanSvg(svg)) : svg;
}

// Damaged files may well load, as a picture of nothing.
static bool IsVisible(const wxBitmapBundle &picture)
{
    if (!picture.IsOk())
        return false;
    wxImage image = picture.GetBitmap(picture.GetDefaultSize()).ConvertToImage();
    for (int y = 0; image.IsOk() && y < image.GetHeight(); ++y) {
        for (int x = 0; x < image.GetWidth(); ++x) {
            if (!image.IsTransparent(x, y))
                return true;
        }
    }
    return false;
}

static wxBitmapBundle OrNothing(const wxBitmapBundle &picture)
{
    return IsVisible(picture) ? picture : wxBitmapBundle();
}

wxBitmapBundle Icon_LoadFile(const char *path, wxSize size)
{
    wxString name = path ? wxString(path, *wxConvFileName) : wxString();
    if (name.empty())
        return {};
    wxBitmapBundle picture = HasEnding(name, "svg") ? LoadSvg(name, size) : LoadPixels(name, size);
    return OrNothing(picture);
}

static wxBitmapBundle LoadIcon(const char *name, wxSize size)
{
    char *path = name ? TNSearch("Icon", name) : nullptr;
    wxBitmapBundle icon = Icon_LoadFile(path, size);
    free(path);
    return icon;
}

wxBitmapBundle Icon_Load(const char *name, int size, const wxArtID &fallback)
{
    wxBitmapBundle icon = LoadIcon(name, wxSize(size, size));
    if (!icon.IsOk() && !fallback.empty())
        icon =
            OrNothing(wxArtProvider::GetBitmapBundle(fallback, wxART_TOOLBAR, wxSize(size, size)));
    return icon.IsOk() ? icon : wxBitmapBundle::FromSVG(MISSING, wxSize(size, size));
}

wxIconBundle Icon_Program()
{
    wxIconBundle icons;
    wxBitmapBundle picture = LoadIcon("cartulo", wxSize(PROGRAM_ICON_SIZE, PROGRAM_ICON_SIZE));
    if (!picture.IsOk())
        return icons;
    for (int size : {16, 24, 32, 48, 64, 128}) {
        wxIcon icon;
        icon.CopyFromBitmap(picture.GetBitmap(wxSize(size, size)));
        if (icon.IsOk())
            icons.AddIcon(icon);
    }
    return icons;
}

// Beside a label, the picture has more width than it fills: GTK leaves no gap there.
static wxBitmapBundle ButtonPicture(const char *icon, bool hasLabel)
{
    return hasLabel ? LoadIcon(icon, wxSize(BUTTON_ICON_SIZE + BUTTON_GAP, BUTTON_ICON_SIZE))
                    : Icon_Load(icon, BUTTON_ICON_SIZE);
}

xBitmapButton::xBitmapButton(wxWindow *parent, wxWindowID id, const wxString &label,
                             const char *icon)
    : wxButton(parent, id, label, wxDefaultPosition, wxDefaultSize,
               label.empty() ? wxBU_EXACTFIT | wxBU_NOTEXT : 0)
{
    wxBitmapBundle picture = ButtonPicture(icon, !label.empty());
    if (picture.IsOk())
        SetBitmap(picture);
    SetCanFocus(false); // the toolkit asks AcceptsFocus for the keyboard, this is for clicks
}

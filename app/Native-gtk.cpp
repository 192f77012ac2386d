#include "app/Native.h"

#include <cstring>

#include <gdk/gdkx.h>
#include <gtk/gtk.h>

long Native_WindowHandle(wxTopLevelWindow *window)
{
    GtkWidget *widget = GTK_WIDGET(window->GetHandle());
    gtk_widget_realize(widget);
    GdkWindow *inner = gtk_widget_get_window(widget);
    return inner && GDK_IS_X11_WINDOW(inner) ? long(GDK_WINDOW_XID(inner)) : 0;
}

int Native_LatinLetter(const wxKeyEvent &event)
{
    // Codes of the three letter rows; every layout leaves them where they are.
    static const struct {
        unsigned first;
        const char *letters;
    } Rows[] = {{24, "QWERTYUIOP"}, {38, "ASDFGHJKL"}, {52, "ZXCVBNM"}};
    unsigned code = event.GetRawKeyFlags();
    for (const auto &row : Rows) {
        if (code >= row.first && code < row.first + strlen(row.letters))
            return row.letters[code - row.first];
    }
    return 0;
}

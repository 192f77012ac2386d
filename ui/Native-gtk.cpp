// ui/Native-gtk.cpp - what only the window system can answer.
#include "ui/Native.h"

#include <cstring>

#include <X11/Xlib.h>
#include <gdk/gdkx.h>
#include <gtk/gtk.h>

#include "base/Companion.h"

long Native_WindowHandle(wxTopLevelWindow *window)
{
    GtkWidget *widget = GTK_WIDGET(window->GetHandle());
    gtk_widget_realize(widget);
    GdkWindow *inner = gtk_widget_get_window(widget);
    return inner && GDK_IS_X11_WINDOW(inner) ? long(GDK_WINDOW_XID(inner)) : 0;
}

// A message to the window manager, from a program that acts for the user.
static void AskForActivation(Display *screen, Window root, Window window)
{
    enum { FROM_A_PAGER = 2 };
    XEvent event = {};
    event.xclient.type = ClientMessage;
    event.xclient.window = window;
    event.xclient.message_type = XInternAtom(screen, "_NET_ACTIVE_WINDOW", False);
    event.xclient.format = 32;
    event.xclient.data.l[0] = FROM_A_PAGER;
    event.xclient.data.l[1] = gtk_get_current_event_time();
    XSendEvent(screen, root, False, SubstructureRedirectMask | SubstructureNotifyMask, &event);
}

void Native_BringForward(long handle)
{
    GdkDisplay *display = gdk_display_get_default();
    int failed = 1;
    if (handle != 0 && display && GDK_IS_X11_DISPLAY(display)) {
        Display *screen = GDK_DISPLAY_XDISPLAY(display);
        XWindowAttributes attributes;
        gdk_x11_display_error_trap_push(display); // the window may be gone
        if (XGetWindowAttributes(screen, Window(handle), &attributes))
            AskForActivation(screen, attributes.root, Window(handle));
        failed = gdk_x11_display_error_trap_pop(display);
    }
    if (failed)
        TNSMessage("WARNING: Native_BringForward ", "there is no such window", TNS_WARNING);
}

bool Native_IsMapped(wxWindow *window)
{
    return gtk_widget_get_mapped(GTK_WIDGET(window->GetHandle()));
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

void Native_KeepScrollBars(wxWindow *scrolled)
{
    gtk_scrolled_window_set_overlay_scrolling(GTK_SCROLLED_WINDOW(scrolled->GetHandle()), FALSE);
}

void Native_MoveToRow(wxListBox *list, int row)
{
    GtkWidget *rows = gtk_bin_get_child(GTK_BIN(list->GetHandle()));
    GtkTreePath *path = gtk_tree_path_new_from_indices(row, -1);
    gtk_tree_view_set_cursor(GTK_TREE_VIEW(rows), path, nullptr, FALSE);
    gtk_tree_path_free(path);
}

int Native_HeightForWidth(const wxWindow *window, int width)
{
    int natural = 0;
    gtk_widget_get_preferred_height_for_width(window->GetHandle(), width, nullptr, &natural);
    return natural;
}

// ui/Native.h - what only the window system can answer. See Native-gtk.cpp.
#pragma once

#include <wx/event.h>
#include <wx/listbox.h>
#include <wx/toplevel.h>

// The handle by which other programs know the window; 0 when the window system has none.
long Native_WindowHandle(wxTopLevelWindow *window);

// Brings a window of this or another program to the front, from the task bar too, and gives it the
// keyboard. Only asks: the window manager decides. Without such a window, a log line.
void Native_BringForward(long handle);

// False for a control that the tool bar hides, because there is no room for it.
bool Native_IsMapped(wxWindow *window);

// The Latin letter, in upper case, that is printed on the key, whatever the keyboard layout makes
// of it; 0 for other keys.
int Native_LatinLetter(const wxKeyEvent &event);

// Scroll bars that stay in sight where there is something to scroll.
void Native_KeepScrollBars(wxWindow *scrolled);

// Selects a row of the list and puts the cursor there, too: the arrow keys go on from it.
void Native_MoveToRow(wxListBox *list, int row);

// The height that a control with wrapping text needs at this width; both in pixels.
int Native_HeightForWidth(const wxWindow *window, int width);

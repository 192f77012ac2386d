// tests/gui/command_table_test.cpp - the table of commands against the event tables of the windows.
#include <gtest/gtest.h>

#include <wx/event.h>

#include "app/MyFrame.h"
#include "ui/Cartulo.h"
#include "ui/Commands.h"

namespace
{

// Their event tables are for derived classes only.
struct PanelTable : Cartulo {
    static const wxEventTableEntry *Entries() { return sm_eventTable.entries; }
};
struct FrameTable : MyFrame {
    static const wxEventTableEntry *Entries() { return sm_eventTable.entries; }
};

// For this command alone, not for a range of them. The last entry has no type.
bool Handles(const wxEventTableEntry *entries, int id)
{
    for (; entries->m_eventType != wxEVT_NULL; ++entries)
        if (entries->m_eventType == wxEVT_MENU && entries->m_id == id &&
            entries->m_lastId == wxID_ANY)
            return true;
    return false;
}

} // namespace

TEST(CommandTable, NamesTheWindowThatHandlesEach)
{
    for (const Command *command = Commands; command < Commands + CommandCount; ++command) {
        bool isOfPanel = command->handler == COMMAND_OF_PANEL;
        EXPECT_EQ(isOfPanel, Handles(PanelTable::Entries(), command->id)) << command->id;
        EXPECT_EQ(!isOfPanel, Handles(FrameTable::Entries(), command->id)) << command->id;
    }
}

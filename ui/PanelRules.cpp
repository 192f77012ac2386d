// ui/PanelRules.cpp - decisions of the editor panel that need no window.
#include "ui/PanelRules.h"

#include "ui/Ids.h"

PanelPane Panel_Pane(int fileCount, int rowCount)
{
    if (fileCount == 0)
        return PANE_OPEN;
    return rowCount > 0 ? PANE_ENTRY : PANE_NEW;
}

static bool IsWritable(const BibFileSet *set, int file)
{
    return file >= 0 && file < set->count && !set->files[file]->readOnly;
}

PanelTools Panel_Tools(const BibFileSet *set, int file, bool editMode)
{
    if (editMode)
        return {false, false};
    PanelTools tools = {IsWritable(set, file), IsWritable(set, file)};
    for (int i = 0; i < set->count && !tools.add; ++i)
        tools.add = IsWritable(set, i); // a new entry may go to any file
    return tools;
}

std::string Panel_SaveQuestion(const BibFileSet *set)
{
    return "There are modified Bib-files:\n\n" + FileSet_ModifiedPaths(set) +
           "\nDo you want to save them ?";
}

int Panel_RowToRemove(int id, int focusedRow, int storedRows)
{
    if (id >= ID_REMOVE_ROW && id < ID_REMOVE_ROW_END)
        return id - ID_REMOVE_ROW;
    if (id != ID_REMOVE_FIELD)
        return -1;
    return focusedRow >= 0 ? focusedRow : storedRows;
}

// ui/TypeChoice.cpp - choosing the type of an entry: all of the store's but the fixed ones, which
// no entry has.
#include "ui/TypeChoice.h"

#include <algorithm>

#include <wx/choice.h>

#include "store/BibStore.h"
#include "ui/DisplayText.h"

// No letter is wider than it is high, and measuring takes its time: most names go in as they are.
void TypeChoice_Fill(wxChoice *choice, int width)
{
    int known = BIB_FIXED_TYPES + int(choice->GetCount());
    if (known >= BibTypeCount)
        return;
    const size_t fits = size_t(choice->FromDIP(width) / choice->GetCharHeight());
    wxArrayString names;
    for (int i = known; i < BibTypeCount; ++i) {
        wxString name = OwnText(BibTypeTable[i]);
        names.Add(name.length() <= fits ? name : ShortText(choice, name, width));
    }
    choice->Append(names);
}

void TypeChoice_Select(wxChoice *choice, int type)
{
    choice->SetSelection(std::max<int>(type - BIB_FIXED_TYPES, wxNOT_FOUND));
}

int TypeChoice_Type(const wxChoice *choice)
{
    int item = choice->GetSelection();
    return item == wxNOT_FOUND ? -1 : item + BIB_FIXED_TYPES;
}

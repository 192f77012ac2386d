#include "ui/TypeChoice.h"

#include <algorithm>

#include <wx/choice.h>

#include "store/BibStore.h"
#include "ui/DisplayText.h"

void TypeChoice_Fill(wxChoice *choice, int width)
{
    for (int i = BIB_FIXED_TYPES + int(choice->GetCount()); i < BibTypeCount; ++i)
        choice->Append(ShortText(choice, StoreText(BibTypeTable[i]), width));
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

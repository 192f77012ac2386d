// ui/TypeChoice.h - choosing the type of an entry: all of the store's but the fixed ones, which no
// entry has.
#pragma once

class wxChoice;

void TypeChoice_Fill(wxChoice *choice, int width); // appends the types that it lacks; see ShortText
void TypeChoice_Select(wxChoice *choice, int type); // nothing for a fixed type
int TypeChoice_Type(const wxChoice *choice);        // index into BibTypeTable; -1 for none

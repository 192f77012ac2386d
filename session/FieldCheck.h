// session/FieldCheck.h - the rules for a field, in one table: what refuses a value, and what warns
// of it.
//
// Asked by whatever stores a value: the commit of an entry, a new entry (for the names of its
// fields), abbreviations, and preambles, which have values but no names. Which fields an entry
// lacks is a question about the entry: Schema_Advise.
#pragma once

#include <string>

#include "store/BibStore.h"

struct EncodingRecord;
struct StringSources;

// A field as it would be stored, and what it was. Who asks for refusals gives what refuses, who
// asks for warnings what warns.
struct FieldFacts {
    bool isChanged; // the user has typed the value

    // What refuses.
    std::string name;  // store text; only read when it is new to the entry
    bool isNew;        // it is
    std::string value; // store text

    // What warns; only read when the value is changed.
    std::wstring label;             // how the user knows the field
    std::wstring text;              // what was typed
    std::wstring filled;            // what was shown before
    std::string stored;             // the value before
    bool textGuillemets;            // there was text with guillemets where it was typed
    const EncodingRecord *encoding; // of the file
    const StringSources *sources;   // of abbreviations; null: all are known
};

struct FieldRule {
    const char *id; // to name it in tests and reports
    bool (*applies)(const FieldFacts &field);

    // One of these, the other is null. Why the field can't be stored: static text, null when it
    // can; or a line for the user on what would be lost, "" for nothing.
    const char *(*refuses)(const FieldFacts &field);
    std::wstring (*warns)(const FieldFacts &field);
};
extern const FieldRule FieldRules[];
extern const int FieldRuleCount;

// What the first rule says that refuses the field; null when none does.
const char *FieldCheck_Refusal(const FieldFacts &field);

// A line of each rule that warns; "" for none. To be followed by FieldCheck_Question.
std::wstring FieldCheck_Warnings(const FieldFacts &field);
extern const wchar_t FieldCheck_Question[];

extern const char FieldCheck_NameText[]; // what is wrong with a name that can't be written

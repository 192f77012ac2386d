// session/FieldCheck.cpp - the rules for a field: what refuses a value, and what warns of it.
#include "session/FieldCheck.h"

#include "encoding/Encoding.h"
#include "session/KnownStrings.h"
#include "session/Values.h"

const wchar_t FieldCheck_Question[] = L"\nDo you want to accept these changes anyway ?";

const char FieldCheck_NameText[] = "A field of this name can't be written to a BIB file.\n"
                                   "It must not begin with a digit, and hold no backslash "
                                   "or control character.";

// --- When they apply ---

static bool Always(const FieldFacts &)
{
    return true;
}

static bool IsNew(const FieldFacts &field)
{
    return field.isNew;
}

// A value that was loaded stays as it is, whatever it holds.
static bool IsChanged(const FieldFacts &field)
{
    return field.isChanged;
}

// Where guillemets were text before, those that the user types may be meant so, too.
static bool MayMeanText(const FieldFacts &field)
{
    return field.isChanged && field.textGuillemets;
}

static bool KnowsAbbreviations(const FieldFacts &field)
{
    return field.isChanged && field.sources;
}

// --- What refuses a field ---

// The parser would not read it back.
static const char *CheckName(const FieldFacts &field)
{
    return Bib_IsName(field.name.c_str()) ? nullptr : FieldCheck_NameText;
}

static const char *CheckSyntax(const FieldFacts &field)
{
    return Bib_CheckValue(field.value.c_str());
}

static const char *CheckMarks(const FieldFacts &field)
{
    if (!Value_HasBadMarks(field.value))
        return nullptr;
    return "The name of an abbreviation is missing, begins with a digit, or holds a backslash or a "
           "control character";
}

// --- What warns of it ---

static std::wstring WarnOfLostCharacters(const FieldFacts &field)
{
    return Value_LostText(field.label, field.text, field.encoding);
}

static std::wstring WarnOfReplacedBytes(const FieldFacts &field)
{
    return Value_ReplacedText(field.label, field.text, field.stored, field.encoding);
}

static std::wstring WarnOfGuillemets(const FieldFacts &field)
{
    return Value_GuillemetText(field.label, field.text);
}

static std::wstring WarnOfUnknownAbbreviations(const FieldFacts &field)
{
    return Strings_UnknownIn(field.sources, field.label, field.text, field.filled);
}

// --- The table ---

const FieldRule FieldRules[] = {
    {"name", IsNew, CheckName, nullptr},
    {"syntax", Always, CheckSyntax, nullptr},
    {"marks", IsChanged, CheckMarks, nullptr},
    {"lost-characters", IsChanged, nullptr, WarnOfLostCharacters},
    {"replaced-bytes", IsChanged, nullptr, WarnOfReplacedBytes},
    {"guillemets", MayMeanText, nullptr, WarnOfGuillemets},
    {"unknown-abbreviations", KnowsAbbreviations, nullptr, WarnOfUnknownAbbreviations},
};
const int FieldRuleCount = sizeof FieldRules / sizeof *FieldRules;

const char *FieldCheck_Refusal(const FieldFacts &field)
{
    for (const FieldRule &rule : FieldRules) {
        const char *reason = rule.refuses && rule.applies(field) ? rule.refuses(field) : nullptr;
        if (reason)
            return reason;
    }
    return nullptr;
}

std::wstring FieldCheck_Warnings(const FieldFacts &field)
{
    std::wstring lines;
    for (const FieldRule &rule : FieldRules)
        if (rule.warns && rule.applies(field))
            lines += rule.warns(field);
    return lines;
}

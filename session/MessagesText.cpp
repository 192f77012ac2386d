// session/MessagesText.cpp - what the loading-messages window says.
#include "session/MessagesText.h"

#include "encoding/Encoding.h"
#include "session/Values.h"

static int HasLoadErrors(const BibFileSet *set)
{
    return set->loadErrors && *set->loadErrors;
}

MessagesVerdict Messages_Verdict(const BibFileSet *set)
{
    long long errors = 0, warnings = 0;
    for (int i = 0; i < set->count; ++i) {
        errors += set->files[i]->errorCount;
        warnings += set->files[i]->warningCount;
    }
    if (errors > 0 || HasLoadErrors(set))
        return MESSAGES_ERRORS;
    return warnings > 0 ? MESSAGES_WARNINGS : MESSAGES_NONE;
}

const char *Messages_Heading(MessagesVerdict verdict)
{
    switch (verdict) {
    case MESSAGES_ERRORS:
        return "There are errors in loading BIB files";
    case MESSAGES_WARNINGS:
        return "There are warnings in loading BIB files";
    default:
        return "There is no any messages related with loading BIB-files"; // stands so
    }
}

int Messages_HasCounts(const BibFileSet *set)
{
    for (int i = 0; i < set->count; ++i) {
        if (set->files[i]->errorCount != 0 || set->files[i]->warningCount != 0)
            return 1;
    }
    return 0;
}

// " 1 error", " 3 errors"; nothing for 0.
static std::wstring CountText(int count, const wchar_t *word)
{
    if (count == 0)
        return L"";
    return L" " + std::to_wstring(count) + L" " + word + (count == 1 ? L"" : L"s");
}

static std::wstring CountsText(const BibFile *file)
{
    if (file->errorCount == 0 && file->warningCount == 0)
        return L"";
    const wchar_t *joint = file->errorCount != 0 && file->warningCount != 0 ? L" and" : L"";
    return L" has" + CountText(file->errorCount, L"error") + joint +
           CountText(file->warningCount, L"warning");
}

std::wstring Messages_Text(const BibFileSet *set, std::wstring (*pathText)(const char *text))
{
    std::wstring text;
    if (HasLoadErrors(set))
        text = pathText(set->loadErrors);
    for (int i = 0; i < set->count; ++i) {
        const BibFile *file = set->files[i];
        text += L"The file: '" + pathText(file->path) + L"'" + CountsText(file) + L":\n";
        if (file->messages)
            text += Value_Show(file->messages, Bib_Encoding(file));
        text += L"\n";
    }
    return text;
}

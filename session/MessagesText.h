// session/MessagesText.h - what the loading-messages window says.
#pragma once

#include <string>

#include "session/FileSet.h"

enum MessagesVerdict { MESSAGES_NONE, MESSAGES_WARNINGS, MESSAGES_ERRORS };

// The worst thing that loading the files of the set brought.
MessagesVerdict Messages_Verdict(const BibFileSet *set);

// The heading for a verdict.
const char *Messages_Heading(MessagesVerdict verdict);

// 1 when a file of the set has an error or a warning: the tool bar then has a tool for them.
int Messages_HasCounts(const BibFileSet *set);

// The text: what could not be opened, then each file with its counts and its messages.
// `pathText` turns text with file names, in the system's encoding, into display text; the
// messages hold bytes of the files and are store text.
std::wstring Messages_Text(const BibFileSet *set, std::wstring (*pathText)(const char *text));

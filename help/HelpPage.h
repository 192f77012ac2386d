// help/HelpPage.h - what the help program shows: which file, what page, and where in it a text is.
// Texts are UTF-8.
#pragma once

#include <string>
#include <vector>

// The manual's path, as HTML: beside the program, else in share/doc/cartulo beside one of the
// folders above it. "" when there is none.
std::string Help_FindManual(const char *program);

// What to tell a user who asked for this topic: "" when it is the manual's or none.
std::string Help_Notice(const char *topic);

// The page for the window: the manual, in these colours ("#rrggbb"), below the notice. Its title is
// the manual's first heading.
struct HelpColours {
    std::string background, text, link;
};
std::string Help_Page(const std::string &manual, const HelpColours &colours,
                      const std::string &notice);

int Help_IsWebAddress(const char *address); // 1 for what a browser or mail program opens

// Words that hold a text: the indices of the first and the last one; -1 for none.
struct HelpPlace {
    int first, last;
};

// The first place of a text, which may run over several words, at or behind the word `start`; after
// the last one it goes on at the top. Blanks count as one, and those around the text not. The
// caller has made the letters of both small.
HelpPlace Help_FindText(const std::vector<std::string> &words, const std::string &text, int start);

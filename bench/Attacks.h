// bench/Attacks.h - clients of the command channel that do what they can to keep a program busy.
// They run in processes of their own.
#pragma once

#include <string>
#include <vector>

#include <sys/types.h>

struct Victim {
    std::string service;
    std::string path;     // of its socket
    std::string openFile; // a file that it has open
};

struct Attack {
    const char *name;
    void (*run)(const Victim &victim); // does not return; null for none
    int processes;
};

extern const std::vector<Attack> Attacks;

std::vector<pid_t> Attacks_Start(const Attack &attack, const Victim &victim);
void Attacks_Stop(const std::vector<pid_t> &processes); // without waiting for their end
void Attacks_Await(const std::vector<pid_t> &processes);

// A client that means well, asks one thing, and asks again when there is no answer in a second, as
// a second start of the program does. Exits with 0 when it gets the answer, else with 1.
pid_t Attacks_StartHonestClient(const Victim &victim);

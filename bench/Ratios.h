// bench/Ratios.h - measured times by name, and what they are against each other.
#pragma once

#include <map>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

// Given to Google Benchmark, it collects the repetitions of every benchmark.
class Ratios : public benchmark::ConsoleReporter
{
public:
    void Add(const std::string &name, double milliseconds);

    // Of all times of that name; 0 when there are none. A disk now and then takes three times as
    // long; the median does not care.
    double Median(const std::string &name) const;
    double Maximum(const std::string &name) const;
    size_t Count(const std::string &name) const;

    void Print() const; // minimum, median, average and maximum of everything, as it was measured
    void PrintRatio(const char *what, const char *name, const char *reference) const; // of medians

    void ReportRuns(const std::vector<Run> &runs) override;
    bool ReportContext(const Context &) override { return true; }

private:
    std::vector<std::string> m_names; // in the order in which they came
    std::map<std::string, std::vector<double>> m_times;
};

// bench/Ratios.cpp - measured times by name, and what they are against each other.
#include "bench/Ratios.h"

#include <algorithm>
#include <cstdio>
#include <numeric>

void Ratios::Add(const std::string &name, double milliseconds)
{
    std::vector<double> &times = m_times[name];
    if (times.empty())
        m_names.push_back(name);
    times.push_back(milliseconds);
}

double Ratios::Median(const std::string &name) const
{
    auto found = m_times.find(name);
    if (found == m_times.end())
        return 0;
    std::vector<double> sorted = found->second;
    std::sort(sorted.begin(), sorted.end());
    return sorted[sorted.size() / 2];
}

double Ratios::Maximum(const std::string &name) const
{
    auto found = m_times.find(name);
    return found == m_times.end() ? 0
                                  : *std::max_element(found->second.begin(), found->second.end());
}

size_t Ratios::Count(const std::string &name) const
{
    auto found = m_times.find(name);
    return found == m_times.end() ? 0 : found->second.size();
}

void Ratios::Print() const
{
    printf("%-36s %10s %10s %10s %10s   (ms)\n", "", "minimum", "median", "average", "maximum");
    for (const std::string &name : m_names) {
        const std::vector<double> &times = m_times.at(name);
        double least = *std::min_element(times.begin(), times.end());
        double sum = std::accumulate(times.begin(), times.end(), 0.0);
        printf("%-36s %10.2f %10.2f %10.2f %10.2f\n", name.c_str(), least, Median(name),
               sum / static_cast<double>(times.size()), Maximum(name));
    }
}

void Ratios::PrintRatio(const char *what, const char *name, const char *reference) const
{
    printf("%-60s %6.2f\n", what, Median(name) / Median(reference));
}

void Ratios::ReportRuns(const std::vector<Run> &runs)
{
    for (const Run &run : runs)
        if (run.run_type == Run::RT_Iteration && !run.error_occurred)
            Add(run.run_name.function_name, run.GetAdjustedRealTime());
}

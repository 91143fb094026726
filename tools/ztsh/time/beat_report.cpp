#include "time/beat_report.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <map>
#include <string>

namespace ztsh {

namespace {

constexpr int bar_width = 40;

/// Gives the power of two that a lateness reaches; 0 stays alone.
std::int64_t doubling_of(std::int64_t lateness)
{
    std::int64_t start = lateness > 0 ? 1 : 0;
    while (start * 2 <= lateness && start > 0)
        start *= 2;
    return start;
}

/// How many beats there are in each doubling, by its least lateness.
std::map<std::int64_t, std::int64_t>
doublings_of(const ZtTimerBeatStatistics& statistics)
{
    std::map<std::int64_t, std::int64_t> doublings;
    for (int i = 0; i < ZtTimerBeatStatistics::bucket_count; ++i)
        if (statistics.lateness[i] > 0)
            doublings[doubling_of(ZtTimerBeatStatistics::BucketStart(i))] +=
                statistics.lateness[i];
    return doublings;
}

void write_bar(std::ostream& out, std::int64_t start, std::int64_t beats,
               std::int64_t most)
{
    // Whatever occurred is to be seen.
    auto length = static_cast<std::size_t>(
        beats > 0 ? std::max<std::int64_t>(beats * bar_width / most, 1) : 0);
    std::string bar(length, '#');
    char line[128];
    std::snprintf(line, sizeof line, "%10lld us %-*s %lld\n",
                  static_cast<long long>(start), bar_width, bar.c_str(),
                  static_cast<long long>(beats));
    out << line;
}

} // namespace

void WriteBeatReport(std::ostream& out, const ZtTimerBeatStatistics& statistics)
{
    constexpr double median = 0.5;
    constexpr double nearly_all = 0.99;
    out << "beats: " << statistics.beats << "\n"
        << "overruns: " << statistics.overruns << "\n"
        << "lateness: median " << statistics.Quantile(median) << " us, 99% "
        << statistics.Quantile(nearly_all) << " us, longest "
        << statistics.latest << " us\n";
    std::map<std::int64_t, std::int64_t> doublings = doublings_of(statistics);
    if (doublings.empty())
        return;
    std::int64_t most = 0;
    for (const auto& [start, beats] : doublings)
        most = std::max(most, beats);
    std::int64_t last = doublings.rbegin()->first;
    for (std::int64_t start = doublings.begin()->first; start <= last;
         start = start > 0 ? start * 2 : 1)
        write_bar(out, start, doublings[start], most);
}

} // namespace ztsh

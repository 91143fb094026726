#include "time/beat_report.h"

#include <sstream>

#include <gtest/gtest.h>

using namespace ztsh;

namespace {

std::string Report(const ZtTimerBeatStatistics& statistics)
{
    std::ostringstream out;
    WriteBeatReport(out, statistics);
    return out.str();
}

/// Counts beats that came so many microseconds late.
void Add(ZtTimerBeatStatistics& statistics, std::int64_t lateness,
         std::int64_t beats)
{
    int bucket = 0;
    while (bucket + 1 < ZtTimerBeatStatistics::bucket_count &&
           ZtTimerBeatStatistics::BucketStart(bucket + 1) <= lateness)
        ++bucket;
    statistics.lateness[bucket] += beats;
    statistics.beats += beats;
    statistics.latest = std::max(statistics.latest, lateness);
}

} // namespace

TEST(WriteBeatReport, WithoutABeatThereIsNothingToDraw)
{
    EXPECT_EQ(Report(ZtTimerBeatStatistics{}),
              "beats: 0\n"
              "overruns: 0\n"
              "lateness: median 0 us, 99% 0 us, longest 0 us\n");
}

TEST(WriteBeatReport, DrawsABarForEachDoublingInBetween)
{
    ZtTimerBeatStatistics statistics = {};
    Add(statistics, 2, 10);
    Add(statistics, 3, 10);
    Add(statistics, 4, 80);
    Add(statistics, 16, 1);
    statistics.overruns = 3;

    EXPECT_EQ(Report(statistics),
              "beats: 101\n"
              "overruns: 3\n"
              "lateness: median 4 us, 99% 4 us, longest 16 us\n"
              "         2 us ##########                               20\n"
              "         4 us ######################################## 80\n"
              "         8 us                                          0\n"
              "        16 us #                                        1\n");
}

TEST(WriteBeatReport, PunctualBeatsHaveABarOfTheirOwn)
{
    ZtTimerBeatStatistics statistics = {};
    Add(statistics, 0, 2);
    Add(statistics, 1, 1);

    EXPECT_EQ(Report(statistics),
              "beats: 3\n"
              "overruns: 0\n"
              "lateness: median 0 us, 99% 1 us, longest 1 us\n"
              "         0 us ######################################## 2\n"
              "         1 us ####################                     1\n");
}

TEST(WriteBeatReport, CountsEveryBeatOnce)
{
    ZtTimerBeatStatistics statistics = {};
    for (int i = 0; i < ZtTimerBeatStatistics::bucket_count; ++i)
        Add(statistics, ZtTimerBeatStatistics::BucketStart(i), 1);

    std::istringstream report(Report(statistics));
    long counted = 0;
    std::string line;
    for (int i = 0; i < 3; ++i)
        std::getline(report, line);
    while (std::getline(report, line))
        counted += std::stol(line.substr(line.rfind(' ')));

    EXPECT_EQ(counted, ZtTimerBeatStatistics::bucket_count);
}

#include "ZT/timer.h"

#include <bit>
#include <cmath>

#include "time/beat_statistics.h"

namespace {
// Lateness up to here has a bucket a microsecond; from here on, the three bits
// below the leading one tell the bucket within a doubling.
constexpr int fine_buckets = 16;
constexpr int leading_bit_of_fine = 4;
constexpr int sub_bits = 3;
constexpr int buckets_a_doubling = 1 << sub_bits;

int bucket_of(std::int64_t microseconds)
{
    const auto value = static_cast<std::uint64_t>(microseconds);
    if (value < fine_buckets)
        return static_cast<int>(value);
    const int leading_bit = static_cast<int>(std::bit_width(value)) - 1;
    const int within = static_cast<int>(value >> (leading_bit - sub_bits)) -
                       buckets_a_doubling;
    const int bucket =
        fine_buckets +
        (leading_bit - leading_bit_of_fine) * buckets_a_doubling + within;
    constexpr int last = ZtTimerBeatStatistics::bucket_count - 1;
    return bucket < last ? bucket : last;
}
} // namespace

std::int64_t ZtTimerBeatStatistics::BucketStart(int bucket)
{
    if (bucket < 0 || bucket >= bucket_count)
        return 0;
    if (bucket < fine_buckets)
        return bucket;
    const int doubling = (bucket - fine_buckets) / buckets_a_doubling;
    const int within = (bucket - fine_buckets) % buckets_a_doubling;
    return static_cast<std::int64_t>(buckets_a_doubling + within)
           << (doubling + leading_bit_of_fine - sub_bits);
}

std::int64_t ZtTimerBeatStatistics::Quantile(double fraction) const
{
    const double wanted = std::ceil(fraction * static_cast<double>(beats));
    std::int64_t counted = 0;
    for (int bucket = 0; bucket < bucket_count; ++bucket) {
        counted += lateness[bucket];
        if (counted > 0 && static_cast<double>(counted) >= wanted) {
            const bool last = bucket + 1 == bucket_count;
            const std::int64_t end =
                last ? latest : BucketStart(bucket + 1) - 1;
            return end < latest ? end : latest;
        }
    }
    return latest;
}

void zt_time::note_beat(ZtTimerBeatStatistics& statistics,
                        std::int64_t late_microseconds)
{
    const std::int64_t late = late_microseconds > 0 ? late_microseconds : 0;
    ++statistics.beats;
    ++statistics.lateness[bucket_of(late)];
    if (late > statistics.latest)
        statistics.latest = late;
}

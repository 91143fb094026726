#include "edge/search.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <map>
#include <utility>

namespace edge {

namespace {

// Sizes are counted in steps of 1/32 octave from the thumbnail's own.
constexpr int steps_an_octave = 32;
constexpr int smallest_size = -steps_an_octave;
constexpr int largest_size = steps_an_octave;
constexpr int coarse_step = 8;

constexpr int coarsest_level = 4;
constexpr int least_coarse_height = 15; ///< Values a coarse pattern keeps.
constexpr std::size_t kept_a_size = 8;  ///< Places followed for each size.
constexpr std::size_t kept_in_all = 16; ///< After the first refinement.
constexpr int most_moves = 16;          ///< Of a place on one level.

// A coarse score below this part of the threshold will not rise above it. Fine
// grain is nearly lost on the coarse levels, so the part is small.
constexpr double hopeless = 0.25;

constexpr double same_while_refined = 0.5; ///< Overlap of one and the same.
constexpr double same_in_the_end = 0.3;

/// A place that may turn out to show the thumbnail, and how far it has been
/// followed.
struct Place
{
    int x = 0;
    int y = 0;
    int size = 0;               ///< In steps from the thumbnail's own.
    int level = 0;              ///< Of the frame; 0 is full resolution.
    int step = coarse_step / 2; ///< Of size, to be tried next; 0 at the end.
    double score = 0.0;

    bool IsFinal() const { return level == 0 && step == 0; }
};

/// Orders places by their scores; of equal ones the lower and more left comes
/// first, so that the order never depends on how they were found.
bool is_better(const Place& a, const Place& b)
{
    if (a.score != b.score)
        return a.score > b.score;
    if (a.size != b.size)
        return a.size < b.size;
    return a.y != b.y ? a.y < b.y : a.x < b.x;
}

/// Gives the area that two hits share, by the area that they cover together.
double overlap(const Hit& a, const Hit& b)
{
    const auto shared = [](int a_begin, int a_size, int b_begin, int b_size) {
        return std::max(0, std::min(a_begin + a_size, b_begin + b_size) -
                               std::max(a_begin, b_begin));
    };
    const double both =
        static_cast<double>(shared(a.x, a.width, b.x, b.width)) *
        shared(a.y, a.height, b.y, b.height);
    const double all = static_cast<double>(a.width) * a.height +
                       static_cast<double>(b.width) * b.height - both;
    return both / all;
}

/// Leaves only the best so many places, the best first.
void keep_best(std::vector<Place>& places, std::size_t most)
{
    std::sort(places.begin(), places.end(), is_better);
    if (places.size() > most)
        places.resize(most);
}

/// The scores of a pattern at every place of a level.
struct ScoreMap
{
    ScoreMap(const Level& level, const Pattern& pattern)
        : columns(level.grey.width - pattern.width + 1),
          rows(level.grey.height - pattern.height + 1)
    {
        scores.reserve(static_cast<std::size_t>(columns) *
                       static_cast<std::size_t>(rows));
        for (int y = 0; y < rows; ++y)
            for (int x = 0; x < columns; ++x)
                scores.push_back(Score(level, pattern, x, y));
    }

    double At(int x, int y) const
    {
        return scores[static_cast<std::size_t>(y) *
                          static_cast<std::size_t>(columns) +
                      static_cast<std::size_t>(x)];
    }

    /// Tells whether no neighbour exceeds the score.
    bool IsPeak(int x, int y) const
    {
        for (int v = std::max(0, y - 1); v <= std::min(rows - 1, y + 1); ++v)
            for (int u = std::max(0, x - 1); u <= std::min(columns - 1, x + 1);
                 ++u)
                if (At(u, v) > At(x, y))
                    return false;
        return true;
    }

    int columns;
    int rows;
    std::vector<double> scores;
};

/// The search for one thumbnail in one frame.
class Searcher
{
public:
    Searcher(const Frame& its_frame, const Grey& its_thumbnail,
             double least_score)
        : frame(its_frame), thumbnail(its_thumbnail), threshold(least_score)
    {}

    std::vector<Hit> Run();

private:
    static int length(int thumbnail_length, int size);
    bool fits(int size) const;
    int coarse_level(int size) const;
    const Pattern& pattern(int size, int level);
    bool lies_inside(const Place& place);
    double score_at(const Place& place);
    std::vector<Place> coarse_places(int size);
    Place resized(const Place& place, int size);
    Place best_around(const Place& place, int step);
    void refine(Place& place, int step);
    void follow(Place& place);
    Hit hit_of(const Place& place) const;
    std::vector<Place> without_doubles(std::vector<Place> places,
                                       double most_overlap) const;

    const Frame& frame;
    const Grey& thumbnail;
    double threshold;
    std::map<std::pair<int, int>, Pattern> patterns; ///< By size and level.
    std::map<std::array<int, 4>, double> scores; ///< Of places tried so far.
};

/// Gives a length of the thumbnail at some size, in pixels of the frame.
int Searcher::length(int thumbnail_length, int size)
{
    const double scale = std::exp2(static_cast<double>(size) / steps_an_octave);
    return std::max(1, static_cast<int>(std::lround(thumbnail_length * scale)));
}

bool Searcher::fits(int size) const
{
    const Grey& whole = frame.At(0).grey;
    return length(thumbnail.width, size) <= whole.width &&
           length(thumbnail.height, size) <= whole.height;
}

/// Gives the most reduced level on which enough of the thumbnail is left.
int Searcher::coarse_level(int size) const
{
    const int height = length(thumbnail.height, size);
    int level = 0;
    while (level + 1 < frame.LevelCount() &&
           height >> (level + 1) >= least_coarse_height)
        ++level;
    return level;
}

/// Gives the thumbnail as it looks at some size on some level. Reduced frames
/// have no part columns, so that what fits into the frame may have to give up
/// a part of its last one.
///
/// Requires: a size that fits.
const Pattern& Searcher::pattern(int size, int level)
{
    Pattern& made = patterns[{size, level}];
    if (made.width == 0) {
        const Grey& picture = frame.At(level).grey;
        const int unit = 1 << level;
        const int width = (length(thumbnail.width, size) + unit / 2) / unit;
        const int height = (length(thumbnail.height, size) + unit / 2) / unit;
        made = PatternOf(thumbnail, std::clamp(width, 1, picture.width),
                         std::clamp(height, 1, picture.height));
    }
    return made;
}

bool Searcher::lies_inside(const Place& place)
{
    const Grey& picture = frame.At(place.level).grey;
    const Pattern& wanted = pattern(place.size, place.level);
    return place.x >= 0 && place.y >= 0 &&
           place.x + wanted.width <= picture.width &&
           place.y + wanted.height <= picture.height;
}

/// Gives the score of a place. Walks of several places meet, so that what was
/// worked out is kept.
double Searcher::score_at(const Place& place)
{
    const auto [known, is_new] =
        scores.try_emplace({place.level, place.size, place.y, place.x}, 0.0);
    if (is_new)
        known->second =
            Score(frame.At(place.level), pattern(place.size, place.level),
                  place.x, place.y);
    return known->second;
}

/// Gives the best places of a size on its coarse level: peaks that are not
/// hopeless.
///
/// Requires: a size that fits.
std::vector<Place> Searcher::coarse_places(int size)
{
    const int level = coarse_level(size);
    const ScoreMap map(frame.At(level), pattern(size, level));
    std::vector<Place> places;
    for (int y = 0; y < map.rows; ++y)
        for (int x = 0; x < map.columns; ++x) {
            Place place{.x = x, .y = y, .size = size, .level = level};
            place.score = map.At(x, y);
            if (place.score > 0.0 && place.score >= hopeless * threshold &&
                map.IsPeak(x, y))
                places.push_back(place);
        }
    keep_best(places, kept_a_size);
    return places;
}

/// Gives the place of another size around the same middle, inside the frame.
///
/// Requires: a size that fits.
Place Searcher::resized(const Place& place, int size)
{
    const Grey& picture = frame.At(place.level).grey;
    const Pattern& before = pattern(place.size, place.level);
    const Pattern& after = pattern(size, place.level);
    const auto moved = [](int begin, int old_length, int new_length, int end) {
        return std::clamp(begin + (old_length - new_length) / 2, 0,
                          end - new_length);
    };
    Place other = place;
    other.size = size;
    other.x = moved(place.x, before.width, after.width, picture.width);
    other.y = moved(place.y, before.height, after.height, picture.height);
    return other;
}

/// Gives the best of a place and of those around it: a pixel aside, and a step
/// of size smaller and larger.
Place Searcher::best_around(const Place& place, int step)
{
    Place best = place;
    for (int size : {place.size - step, place.size, place.size + step}) {
        if (size < smallest_size || size > largest_size || !fits(size))
            continue;
        const Place middle = resized(place, size);
        for (int y = -1; y <= 1; ++y)
            for (int x = -1; x <= 1; ++x) {
                Place there = middle;
                there.x += x;
                there.y += y;
                if (!lies_inside(there))
                    continue;
                there.score = score_at(there);
                if (there.score > best.score)
                    best = there;
            }
    }
    return best;
}

/// Walks uphill until nothing around is better.
void Searcher::refine(Place& place, int step)
{
    for (int move = 0; move < most_moves; ++move) {
        const Place best = best_around(place, step);
        if (best.score <= place.score)
            break;
        place = best;
    }
}

/// Follows a place to the next finer level, if there is one, and there to the
/// best place around, by a finer step of size than before.
void Searcher::follow(Place& place)
{
    if (place.level > 0) {
        --place.level;
        const Grey& picture = frame.At(place.level).grey;
        const Pattern& wanted = pattern(place.size, place.level);
        place.x = std::min(2 * place.x, picture.width - wanted.width);
        place.y = std::min(2 * place.y, picture.height - wanted.height);
        place.score = score_at(place);
    }
    refine(place, std::max(place.step, 1));
    place.step /= 2;
}

Hit Searcher::hit_of(const Place& place) const
{
    const int unit = 1 << place.level;
    return {place.x * unit, place.y * unit, length(thumbnail.width, place.size),
            length(thumbnail.height, place.size), place.score};
}

/// Leaves out what overlaps a better place by more than `most_overlap`.
std::vector<Place> Searcher::without_doubles(std::vector<Place> places,
                                             double most_overlap) const
{
    std::sort(places.begin(), places.end(), is_better);
    std::vector<Place> kept;
    for (const Place& place : places) {
        const Hit hit = hit_of(place);
        const auto covers = [&](const Place& better) {
            return overlap(hit_of(better), hit) > most_overlap;
        };
        if (std::none_of(kept.begin(), kept.end(), covers))
            kept.push_back(place);
    }
    return kept;
}

std::vector<Hit> Searcher::Run()
{
    std::vector<Place> places;
    for (int size = smallest_size; size <= largest_size; size += coarse_step)
        if (fits(size))
            for (const Place& place : coarse_places(size))
                places.push_back(place);

    const auto is_final = [](const Place& place) { return place.IsFinal(); };
    while (!std::all_of(places.begin(), places.end(), is_final)) {
        for (Place& place : places)
            if (!place.IsFinal())
                follow(place);
        places = without_doubles(std::move(places), same_while_refined);
        keep_best(places, kept_in_all);
    }

    std::vector<Hit> hits;
    for (const Place& place :
         without_doubles(std::move(places), same_in_the_end))
        if (place.score >= threshold)
            hits.push_back(hit_of(place));
    return hits;
}

} // namespace

Frame::Frame(Grey picture)
{
    levels.reserve(coarsest_level + 1);
    levels.emplace_back(std::move(picture));
    while (LevelCount() <= coarsest_level) {
        Grey half = Halved(levels.back().grey);
        if (half.values.empty())
            break;
        levels.emplace_back(std::move(half));
    }
}

std::vector<Hit> Search(const Frame& frame, const Grey& thumbnail,
                        double threshold)
{
    if (thumbnail.values.empty() || frame.At(0).grey.values.empty())
        return {};
    return Searcher(frame, thumbnail, threshold).Run();
}

} // namespace edge

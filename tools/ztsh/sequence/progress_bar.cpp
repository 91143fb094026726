#include "sequence/progress_bar.h"

#include "system/terminal.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iostream>

namespace ztsh {

namespace {

constexpr int errors_descriptor = 2;

std::string text_of_seconds(double seconds)
{
    constexpr double longest = 359999;
    long whole = std::lround(std::clamp(seconds, 0.0, longest));
    char text[32];
    if (whole >= 3600)
        std::snprintf(text, sizeof text, "%ld:%02ld:%02ld", whole / 3600,
                      whole / 60 % 60, whole % 60);
    else
        std::snprintf(text, sizeof text, "%ld:%02ld", whole / 60, whole % 60);
    return text;
}

} // namespace

std::string ProgressLine(const Progress& progress, int columns)
{
    char text[160];
    double rate = progress.seconds > 0
                      ? static_cast<double>(progress.done) / progress.seconds
                      : 0;
    int length = std::snprintf(text, sizeof text, "%ld/%ld", progress.done,
                               progress.total);
    std::string line(text, static_cast<std::size_t>(length));
    if (progress.failed > 0)
        line += ", " + std::to_string(progress.failed) + " failed";
    if (rate > 0) {
        double left =
            static_cast<double>(progress.total - progress.done) / rate;
        length = std::snprintf(text, sizeof text, "  %.1f/s  %s left", rate,
                               text_of_seconds(left).c_str());
        line.append(text, static_cast<std::size_t>(length));
    }

    constexpr int most_bar = 30;
    constexpr int least_bar = 5;
    int room = columns - static_cast<int>(line.size()) - 3;
    if (room >= least_bar && progress.total > 0) {
        int bar = std::min(room, most_bar);
        int full = static_cast<int>(bar * progress.done / progress.total);
        std::string drawn(static_cast<std::size_t>(bar), '.');
        drawn.replace(0, static_cast<std::size_t>(full),
                      static_cast<std::size_t>(full), '#');
        line.insert(0, "] ").insert(0, drawn).insert(0, 1, '[');
    }
    return line.substr(0, static_cast<std::size_t>(std::max(columns, 0)));
}

ProgressBar::ProgressBar(long total_jobs, bool is_visible)
    : total(total_jobs), visible(is_visible), start(Clock::now()),
      next_show(start), terminal(std::cerr.rdbuf()), errors(std::cerr, *this),
      output(std::cout, *this)
{}

ProgressBar::~ProgressBar()
{
    Hide();
}

void ProgressBar::Show(long done, long failed)
{
    Clock::time_point now = Clock::now();
    if (!visible || now < next_show)
        return;
    next_show = now + std::chrono::milliseconds(100);
    Progress progress{done, total, failed,
                      std::chrono::duration<double>(now - start).count()};
    // The last column stays free, or some terminals would go to a new line.
    int columns = SizeOfWindow(errors_descriptor).columns - 1;
    terminal << '\r' << ProgressLine(progress, columns) << "\033[K"
             << std::flush;
    shown = true;
}

void ProgressBar::Hide()
{
    if (shown)
        terminal << "\r\033[K" << std::flush;
    shown = false;
}

void ProgressBar::Forget()
{
    shown = false;
}

ProgressBar::Guard::Guard(std::ostream& guarded_stream, ProgressBar& hidden_bar)
    : stream(guarded_stream), former(guarded_stream.rdbuf()), bar(hidden_bar)
{
    put_in(this);
}

ProgressBar::Guard::~Guard()
{
    put_in(former);
}

/// Changes the stream's buffer and keeps its state, which the change would
/// clear.
void ProgressBar::Guard::put_in(std::streambuf* buffer)
{
    std::ios_base::iostate state = stream.rdstate();
    stream.rdbuf(buffer);
    stream.setstate(state);
}

ProgressBar::Guard::int_type ProgressBar::Guard::overflow(int_type character)
{
    bar.Hide();
    if (traits_type::eq_int_type(character, traits_type::eof()))
        return traits_type::not_eof(character);
    return former->sputc(traits_type::to_char_type(character));
}

std::streamsize ProgressBar::Guard::xsputn(const char* text, std::streamsize n)
{
    if (n > 0)
        bar.Hide();
    return former->sputn(text, n);
}

int ProgressBar::Guard::sync()
{
    return former->pubsync();
}

} // namespace ztsh

#ifndef ZTSH_SEQUENCE_PROGRESS_BAR_H
#define ZTSH_SEQUENCE_PROGRESS_BAR_H

/// \file
/// The line at the bottom of a terminal that says how far a sequence is.

#include <chrono>
#include <ostream>
#include <streambuf>
#include <string>

namespace ztsh {

/// How far a sequence is.
struct Progress
{
    long done = 0;
    long total = 0;
    long failed = 0;
    double seconds = 0; ///< Since its start.
};

/// Writes the line: a bar, how many of how many, those that failed, the rate
/// and the time that remains. It is at most `columns` cells wide.
std::string ProgressLine(const Progress& progress, int columns);

/// Shows the line on a terminal and takes it away whenever something else is
/// written; does nothing elsewhere.
class ProgressBar
{
public:
    /// Starts the clock. With `visible` false nothing is ever shown.
    ProgressBar(long total, bool visible);

    /// Takes the line away.
    ~ProgressBar();
    ProgressBar(const ProgressBar&) = delete;
    ProgressBar& operator=(const ProgressBar&) = delete;

    /// Shows the line with new numbers, at most some times a second.
    void Show(long done, long failed);

    /// Takes the line away until the next `Show`.
    void Hide();

    /// Is called in a copy of the process: the line is not the copy's to take
    /// away.
    void Forget();

private:
    /// Stands in a stream's buffer and hides the bar before anything is
    /// written to that stream.
    class Guard : public std::streambuf
    {
    public:
        Guard(std::ostream& guarded_stream, ProgressBar& hidden_bar);
        ~Guard() override;
        Guard(const Guard&) = delete;
        Guard& operator=(const Guard&) = delete;

    protected:
        int_type overflow(int_type character) override;
        std::streamsize xsputn(const char* text, std::streamsize n) override;
        int sync() override;

    private:
        void put_in(std::streambuf* buffer);

        std::ostream& stream;
        std::streambuf* former;
        ProgressBar& bar;
    };

    using Clock = std::chrono::steady_clock;

    long total;
    bool visible;
    bool shown = false;
    Clock::time_point start;
    Clock::time_point next_show;
    std::ostream terminal; ///< Standard error as it is without the guard.
    Guard errors;
    Guard output;
};

} // namespace ztsh

#endif

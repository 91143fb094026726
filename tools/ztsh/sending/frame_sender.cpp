#include "sending/frame_sender.h"

#include "system/stoppable_work.h"

#include <cstdio>

namespace ztsh {

namespace {

/// What the lines of the library begin with.
constexpr const char* start = "Writing to ddr frame ";
constexpr const char* failures[] = {"ERROR: ", "Image is wrong size"};

bool is_failure(const std::string& line)
{
    for (const char* failure : failures)
        if (line.starts_with(failure))
            return true;
    return false;
}

/// Puts pieces of text together to lines.
class Lines
{
public:
    explicit Lines(const std::function<void(const std::string&)>& line_taker)
        : take(line_taker)
    {}

    void Add(const std::string& text)
    {
        rest += text;
        for (std::size_t end = rest.find('\n'); end != std::string::npos;
             end = rest.find('\n')) {
            take(rest.substr(0, end));
            rest.erase(0, end + 1);
        }
    }

private:
    const std::function<void(const std::string&)>& take;
    std::string rest;
};

std::string seconds_text(double seconds)
{
    char text[64];
    std::snprintf(text, sizeof text, "%g", seconds);
    return text;
}

} // namespace

std::string SendToFrameStore(const ZtImageSGI& image, int number,
                             const Sending& sending)
{
    bool failed = false;
    const std::function<void(const std::string&)> take_line =
        [&](const std::string& line) {
            failed = failed || is_failure(line);
            sending.say(line);
        };
    Lines lines(take_line);
    // `ToDDR` changes nothing, it only does not say so.
    ZtImageSGI& sent = const_cast<ZtImageSGI&>(image);
    const auto send = [&] {
        sending.in_child();
        sent.ToDDR(number);
    };
    const WorkEnd end =
        DoStoppably(send, sending.seconds,
                    [&](const std::string& text) { lines.Add(text); });
    switch (end) {
    case WorkEnd::NotStarted:
        return "there is no process to spare";
    case WorkEnd::Crashed:
        return "the process that sent it has crashed";
    case WorkEnd::TimedOut:
        return "it took longer than " + seconds_text(sending.seconds) +
               " seconds (--ddr-timeout)";
    case WorkEnd::Stopped:
        return {};
    case WorkEnd::Done:
        break;
    }
    return failed ? "the line above says why" : "";
}

bool IsAboutTheStart(const std::string& line)
{
    return line.starts_with(start);
}

} // namespace ztsh

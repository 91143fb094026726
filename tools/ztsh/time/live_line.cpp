#include "time/live_line.h"

#include "system/terminal.h"

#include <chrono>
#include <iostream>

namespace ztsh {

namespace {

constexpr int input_descriptor = 0;
constexpr int output_descriptor = 1;
constexpr std::chrono::milliseconds period(40);
constexpr const char* line_start = "\r\x1b[K";

/// Takes the line away for what is run meanwhile.
class IdleBelowLine : public Idle
{
public:
    IdleBelowLine(Idle& whose_idle, KeysAtOnce& terminal_keys)
        : idle(whose_idle), keys(terminal_keys)
    {}

    bool Due() const override { return idle.Due(); }
    bool Over() const override { return idle.Over(); }

    void RunDue() override
    {
        if (!idle.Due())
            return;
        std::cout << line_start << std::flush;
        keys.Pause();
        idle.RunDue();
        keys.GoOn();
    }

private:
    Idle& idle;
    KeysAtOnce& keys;
};

} // namespace

void ShowLive(const std::function<std::string()>& line,
              const std::function<bool()>& ended, Idle& idle)
{
    if (IsTerminal(input_descriptor) && CanRedraw(output_descriptor)) {
        KeysAtOnce keys(input_descriptor);
        IdleBelowLine below(idle, keys);
        while (!ended()) {
            std::cout << line_start << line() << std::flush;
            WaitEnds ends;
            ends.descriptor = input_descriptor;
            ends.deadline = std::chrono::steady_clock::now() + period;
            Waited came = WaitFor(ends, below);
            if (came == Waited::Input)
                keys.TakeKey();
            if (came == Waited::Input || came == Waited::Over)
                break;
        }
        std::cout << line_start;
    }
    std::cout << line() << "\n" << std::flush;
}

} // namespace ztsh

#include "script/idle.h"

#include "system/waiting.h"

namespace ztsh {

Waited WaitFor(const WaitEnds& ends, Idle& idle)
{
    auto happened = [&] { return ends.happened && ends.happened(); };
    auto awake = [&] { return idle.Over() || idle.Due() || happened(); };
    for (;;) {
        if (idle.Over())
            return Waited::Over;
        // What becomes due together with what happens is done, and nothing
        // that becomes due later.
        bool happens = happened();
        idle.RunDue();
        if (idle.Over())
            return Waited::Over;
        if (happens && happened())
            return Waited::Happened;
        switch (Sleep(ends.descriptor, ends.deadline, awake)) {
        case Woken::Input:
            return Waited::Input;
        case Woken::Deadline:
            return Waited::Deadline;
        case Woken::Signal:
            break;
        }
    }
}

} // namespace ztsh

// A host that loads the library, starts its beat and unloads it must go on: no
// alarm may come any more for code that is gone. Loads the shared library, so
// it links no other copy.
//
//   beat_unload_test LIBRARY

#include <cstdio>
#include <dlfcn.h>
#include <signal.h>
#include <time.h>

namespace {

void rest()
{
    for (int count = 0; count < 20; ++count) {
        const timespec pause = {0, 2000000};
        nanosleep(&pause, nullptr);
    }
}

bool alarm_has_a_handler()
{
    struct sigaction now = {};
    sigaction(SIGALRM, nullptr, &now);
    return now.sa_handler != SIG_IGN && now.sa_handler != SIG_DFL;
}

int fail(const char* text)
{
    std::fprintf(stderr, "%s\n", text);
    return 1;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2)
        return fail("one argument: the library");
    void* const library = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    if (!library)
        return fail(dlerror());
    auto* const start = reinterpret_cast<void (*)()>(
        dlsym(library, "_ZN11ZtTimerBeat5startEv"));
    if (!start)
        return fail("no ZtTimerBeat::start");
    start();
    rest();
    if (!alarm_has_a_handler())
        return fail("the beat did not start");

    dlclose(library);

    void* const still_there = dlopen(argv[1], RTLD_NOW | RTLD_NOLOAD);
    std::printf("%s\n", still_there ? "stays loaded" : "unloaded");
    if (!still_there && alarm_has_a_handler())
        return fail("a handler was left behind");
    rest();
    return 0;
}

// Does the one thing that its argument names inside an alarm handler: what the
// beat checker must find, and what it must let pass.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <iostream>
#include <mutex>
#include <signal.h>
#include <string>
#include <sys/time.h>
#include <unistd.h>

namespace {

struct Probe
{
    const char* name;
    void (*act)();
};

void* volatile memory = nullptr;
int* volatile number = nullptr;
volatile std::size_t length = 100;
std::mutex mutex;

void allowed()
{
    timespec now = {};
    clock_gettime(CLOCK_MONOTONIC, &now);
    struct sigaction action = {};
    sigaction(SIGALRM, nullptr, &action);
    sigaction(SIGALRM, &action, nullptr);
    itimerval timer = {};
    setitimer(ITIMER_REAL, &timer, nullptr);
    getitimer(ITIMER_REAL, &timer);
    sigset_t set;
    sigemptyset(&set);
    pthread_sigmask(SIG_BLOCK, &set, nullptr);
    if (write(STDERR_FILENO, "", 0) < 0)
        _exit(1);
}

void guarded_static()
{
    static const std::size_t once = length;
    memory = reinterpret_cast<void*>(once);
}

constexpr Probe probes[] = {
    {"allowed", allowed},
    {"malloc", [] { memory = std::malloc(length); }},
    {"calloc", [] { memory = std::calloc(length, 2); }},
    {"realloc", [] { memory = std::realloc(memory, length * 2); }},
    {"free", [] { std::free(memory); }},
    {"new", [] { number = new int[length]; }},
    {"nothrow_new", [] { number = new (std::nothrow) int; }},
    {"delete", [] { delete[] number; }},
    {"strdup", [] { memory = strdup("text"); }},
    {"string", [] { memory = new std::string(length, 'x'); }},
    {"printf", [] { std::printf("%d\n", 1); }},
    {"fprintf", [] { std::fprintf(stderr, "%d\n", 1); }},
    {"snprintf",
     [] {
         char text[8];
         std::snprintf(text, sizeof text, "%zu", length);
     }},
    {"puts", [] { std::puts("text"); }},
    {"fwrite", [] { std::fwrite("text", 1, length / 50, stdout); }},
    {"fflush", [] { std::fflush(stdout); }},
    {"cerr_text", [] { std::cerr << "text\n"; }},
    {"cerr_number", [] { std::cerr << length; }},
    {"cout_flush", [] { std::cout.flush(); }},
    {"mutex", [] { const std::lock_guard<std::mutex> lock(mutex); }},
    {"guarded_static", guarded_static},
    {"localtime",
     [] {
         const time_t moment = 0;
         memory = std::localtime(&moment);
     }},
    {"throw",
     [] {
         try {
             throw 1;
         } catch (int) {
         }
     }},
};

void (*act)() = nullptr;

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2)
        return 2;
    for (const Probe& probe : probes)
        if (std::strcmp(probe.name, argv[1]) == 0)
            act = probe.act;
    memory = std::malloc(length);
    number = new int[length];
    if (act) {
        signal(SIGALRM, [](int) { act(); });
        raise(SIGALRM);
    }
    return std::strcmp(argv[1], "nothing") != 0 && !act ? 2 : 0;
}

// How late is the beat over 20 seconds, beside a repeating timer of libuv, and
// what does a beat cost the processor? Once on an idle machine, once with
// another process busy on the same core.
//
// Writes its figures in the form of the other benchmarks:
//   bench_beat_lateness --benchmark_out=FILE [--seconds=20]

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include <sched.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#ifdef ZT_BENCH_UV
#include <uv.h>
#endif

#include "ZT/timer.h"

namespace {

constexpr double period = 4e6; // nanoseconds

double Now()
{
    timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) * 1e9 +
           static_cast<double>(now.tv_nsec);
}

double ProcessorTime()
{
    rusage used;
    getrusage(RUSAGE_SELF, &used);
    return static_cast<double>(used.ru_utime.tv_sec + used.ru_stime.tv_sec) *
               1e9 +
           static_cast<double>(used.ru_utime.tv_usec + used.ru_stime.tv_usec) *
               1e3;
}

/// When each beat came; room for all of them is there before the first.
class Beats
{
public:
    explicit Beats(double seconds)
        : times(static_cast<std::size_t>(seconds * 1e9 / period * 2))
    {}

    void Note()
    {
        if (count < times.size())
            times[count++] = Now();
    }

    /// The median of how much longer than asked it took from beat to beat.
    double MedianLateness() const
    {
        std::vector<double> late;
        for (std::size_t i = 1; i < count; ++i)
            late.push_back(times[i] - times[i - 1] - period);
        if (late.empty())
            return 0;
        std::nth_element(late.begin(), late.begin() + late.size() / 2,
                         late.end());
        return std::max(late[late.size() / 2], 0.0);
    }

    double MeanPeriod() const
    {
        return count < 2 ? 0
                         : (times[count - 1] - times[0]) /
                               static_cast<double>(count - 1);
    }

    double Count() const { return static_cast<double>(count); }

private:
    std::vector<double> times;
    std::size_t count = 0;
};

struct Figures
{
    double lateness = 0;
    double mean_period = 0;
    double processor_time = 0;
};

Figures FiguresOf(const Beats& beats, double processor_time)
{
    return {beats.MedianLateness(), beats.MeanPeriod(),
            processor_time / std::max(beats.Count(), 1.0)};
}

void NoteBeat(ZtTimer*, void* beats)
{
    static_cast<Beats*>(beats)->Note();
}

Figures Ours(double seconds)
{
    Beats beats(seconds);
    ZtTimer timer;
    timer.post_repeat(NoteBeat, &beats, 0);
    timer.start();
    const double processor_time = ProcessorTime();
    const double end = Now() + seconds * 1e9;
    ZtTimerBeat::start();
    while (Now() < end)
        pause();
    ZtTimerBeat::stop();
    const double spent = ProcessorTime() - processor_time;
    pause(); // The alarm that was already on its way when the beat was stopped.
    return FiguresOf(beats, spent);
}

#ifdef ZT_BENCH_UV
Figures OfLibuv(double seconds)
{
    struct Run
    {
        Beats beats;
        double end;
    } run{Beats(seconds), 0};
    uv_loop_t loop;
    uv_timer_t timer;
    uv_loop_init(&loop);
    uv_timer_init(&loop, &timer);
    timer.data = &run;
    const double processor_time = ProcessorTime();
    run.end = Now() + seconds * 1e9;
    uv_timer_start(
        &timer,
        [](uv_timer_t* fired) {
            Run& told = *static_cast<Run*>(fired->data);
            told.beats.Note();
            if (Now() >= told.end)
                uv_close(reinterpret_cast<uv_handle_t*>(fired), nullptr);
        },
        4, 4);
    uv_run(&loop, UV_RUN_DEFAULT);
    const double spent = ProcessorTime() - processor_time;
    uv_loop_close(&loop);
    return FiguresOf(run.beats, spent);
}
#endif

/// A process that does nothing but keep the core busy, until it is ended.
pid_t StartBusyProcess()
{
    const pid_t child = fork();
    if (child == 0)
        for (;;)
            asm volatile("");
    return child;
}

class Output
{
public:
    explicit Output(const char* path) : file(std::fopen(path, "w"))
    {
        if (!file)
            std::exit(1);
        std::fputs("{\"benchmarks\": [", file);
    }
    ~Output()
    {
        std::fputs("\n]}\n", file);
        std::fclose(file);
    }
    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;

    void Add(const std::string& name, double nanoseconds)
    {
        std::fprintf(file,
                     "%s\n{\"name\": \"%s\", \"run_type\": \"iteration\", "
                     "\"real_time\": %.1f, \"cpu_time\": %.1f, "
                     "\"time_unit\": \"ns\"}",
                     separator, name.c_str(), nanoseconds, nanoseconds);
        separator = ",";
    }

    void Add(const std::string& load, const std::string& who,
             const Figures& figures)
    {
        Add("beat_late_" + load + "/" + who, figures.lateness);
        Add("beat_period_" + load + "/" + who, figures.mean_period);
        if (load == "idle")
            Add("beat_cpu/" + who, figures.processor_time);
    }

private:
    std::FILE* file;
    const char* separator = "";
};

} // namespace

int main(int argc, char** argv)
{
    std::string out;
    double seconds = 20;
    for (int i = 1; i < argc; ++i) {
        const std::string argument = argv[i];
        if (argument.rfind("--benchmark_out=", 0) == 0)
            out = argument.substr(16);
        if (argument.rfind("--seconds=", 0) == 0)
            seconds = std::atof(argument.c_str() + 10);
    }
    if (out.empty()) {
        std::fputs("bench_beat_lateness --benchmark_out=FILE [--seconds=20]\n",
                   stderr);
        return 2;
    }
    Output output(out.c_str());
    for (const std::string load : {"idle", "busy"}) {
        const pid_t busy = load == "busy" ? StartBusyProcess() : 0;
        output.Add("beat_period_" + load + "/limit", period);
        output.Add(load, "ours", Ours(seconds));
#ifdef ZT_BENCH_UV
        output.Add(load, "libuv", OfLibuv(seconds));
#endif
        if (busy > 0) {
            kill(busy, SIGKILL);
            waitpid(busy, nullptr, 0);
        }
    }
    return 0;
}

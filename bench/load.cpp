// What does it cost a program to load the library, where there is no query
// program and where there is one, beside running the smallest program there is?

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <dlfcn.h>
#include <filesystem>
#include <fstream>
#include <spawn.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

#include "in_a_child.h"

namespace {

/// Ends the program if there is nothing to measure.
void Require(bool done, const char* what)
{
    if (done)
        return;
    std::fprintf(stderr, "load: no %s\n", what);
    std::exit(1);
}

/// Loads the library in a child, since a process does so once; this one has
/// the language's own library already, as any host has.
double SecondsOfOneLoad()
{
    return SecondsInAChild(
        [] { return dlopen(ZT_LIBRARY, RTLD_NOW) != nullptr; });
}

void Load(benchmark::State& state)
{
    unsetenv("QUARN_LOCATION");
    for (auto _ : state)
        state.SetIterationTime(SecondsOfOneLoad());
}

void LoadWithQueryProgram(benchmark::State& state)
{
    namespace fs = std::filesystem;
    std::string folder = (fs::temp_directory_path() / "zt_bench_XXXXXX");
    Require(mkdtemp(folder.data()) != nullptr, "directory");
    fs::create_directory(folder + "/bin");
    const std::string program = folder + "/bin/get_quarn_variable";
    std::ofstream(program) << "#!/bin/sh\necho value\n";
    fs::permissions(program, fs::perms::owner_all);
    setenv("QUARN_LOCATION", folder.c_str(), 1);
    for (auto _ : state)
        state.SetIterationTime(SecondsOfOneLoad());
    unsetenv("QUARN_LOCATION");
    fs::remove_all(folder);
}

void RunTrue(benchmark::State& state)
{
    for (auto _ : state) {
        char name[] = "true";
        char* const words[] = {name, nullptr};
        const double begin = Seconds();
        pid_t child = -1;
        Require(posix_spawn(&child, "/bin/true", nullptr, nullptr, words,
                            environ) == 0,
                "/bin/true");
        waitpid(child, nullptr, 0);
        state.SetIterationTime(Seconds() - begin);
    }
}

} // namespace

BENCHMARK(Load)->Name("library_load/ours")->UseManualTime();
BENCHMARK(RunTrue)->Name("library_load/true")->UseManualTime();
BENCHMARK(LoadWithQueryProgram)
    ->Name("also/library_load_with_a_query_program/ours")
    ->UseManualTime();

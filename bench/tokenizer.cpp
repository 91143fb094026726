// How fast are statements read from memory and from a file, and how fast is one
// dispatched, against the language's rules written down literally?
//
// Targets: reading 12 times the literal rate; a file at least 0.85 of the rate
// from memory; dispatch among 200 directives 1.3 times the literal rate.

#include <cstdlib>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <strings.h>
#include <vector>

#include <benchmark/benchmark.h>

#include "KVO/KvoStatement.h"
#include "ZT/directive.h"
#include "support/LiteralTokenizer.h"
#include "support/TempDir.h"

namespace {
constexpr std::size_t script_bytes = 50'000'000;

/// A script as people write them: short words, numbers, now and then a quoted
/// text, a comment, two statements on a line, a continuation.
const std::string& script()
{
    static const std::string text = [] {
        const char* const lines[] = {
            "move ship 12.5 0 -3.25\n",
            "key camera focal 35 at 1:00:12\n",
            "set ambient 0.1 0.1 0.12; set fog off\n",
            "# lights of the second take\n",
            "echo \"frame done, next one\" 17\n",
            "select group hull panel_left panel_right \\\n  antenna\n",
            "render take2.0042.rgb quality 3 ! draft is enough\n",
            "\n",
            "    rotate turret_upper_assembly 0 90 0\n",
        };
        std::string whole;
        unsigned long state = 1;
        while (whole.size() < script_bytes) {
            state = state * 6364136223846793005UL + 1442695040888963407UL;
            whole += lines[(state >> 33) % (sizeof lines / sizeof lines[0])];
        }
        return whole;
    }();
    return text;
}

void report_rate(benchmark::State& state)
{
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(script().size()));
}

void read_all_literally(std::istream& in)
{
    const LiteralTokenizer tokenizer("!", ";\n");
    std::vector<LiteralToken> statement;
    while (in.good()) {
        statement.clear();
        tokenizer.AppendStatement(in, statement);
        benchmark::DoNotOptimize(statement.data());
    }
}

void read_all(std::istream& in)
{
    KvoStatement statement;
    while (in.good()) {
        statement.Read(in);
        benchmark::DoNotOptimize(statement.Count());
    }
}

template <void (*Reader)(std::istream&)>
void from_memory(benchmark::State& state)
{
    std::istringstream in(script());
    for (auto _ : state) {
        in.clear();
        in.seekg(0);
        Reader(in);
    }
    report_rate(state);
}
BENCHMARK(from_memory<read_all_literally>)->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all>)->Unit(benchmark::kMillisecond);

template <void (*Reader)(std::istream&)>
void from_file(benchmark::State& state)
{
    const TempDir directory;
    const std::string path = directory.Write("script", script());
    for (auto _ : state) {
        std::ifstream in(path);
        Reader(in);
    }
    report_rate(state);
}
BENCHMARK(from_file<read_all_literally>)->Unit(benchmark::kMillisecond);
BENCHMARK(from_file<read_all>)->Unit(benchmark::kMillisecond);

std::vector<std::string> command_words()
{
    std::vector<std::string> words;
    const char* const stems[] = {"move",   "Rotate", "scale", "select", "key",
                                 "render", "Echo",   "light", "camera", "set"};
    for (int i = 0; i < 200; ++i)
        words.push_back(stems[i % 10] + std::to_string(i * 7919 % 1000));
    return words;
}

class CountingDirective : public ZtDirective
{
public:
    using ZtDirective::ZtDirective;
    void Act(KvoStatement*) override { ++acts; }
    long acts = 0;
};

/// The same search with the system's comparison, on objects of the same kind.
class LiteralDirective : public CountingDirective
{
public:
    using CountingDirective::CountingDirective;
    int Compare(void* key) override
    {
        return strcasecmp(name, static_cast<const char*>(key));
    }
};

template <typename Directive>
void dispatch(benchmark::State& state)
{
    srandom(1);
    ZtDispatcher dispatcher;
    std::vector<KvoStatement> statements;
    for (const std::string& word : command_words()) {
        dispatcher.Add(new Directive(word.c_str()));
        statements.emplace_back(word.c_str());
    }
    std::size_t next = 0;
    for (auto _ : state) {
        dispatcher.Delegate(&statements[next]);
        next = (next + 77) % statements.size();
    }
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations()));
}
BENCHMARK(dispatch<LiteralDirective>);
BENCHMARK(dispatch<CountingDirective>);
} // namespace

BENCHMARK_MAIN();

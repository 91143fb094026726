// How fast are statements read from memory and from a file, and how fast is one
// dispatched among 200 directives?
//
// Compared with the rules written down one `get` a character, twice: on plain
// strings and vectors, and on the library's own arrays, which grow by one, with
// a new object for each token. Aims: 12 times the latter at least; a file at
// 0.85 of the rate from memory; dispatch 1.3 times a search of the list.

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <strings.h>
#include <vector>

#include <benchmark/benchmark.h>

#include "KVO/KvoStatement.h"
#include "ZT/directive.h"
#include "support/LiteralTokenizer.h"

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

/// A token whose text is an array that grows by one character at a time.
class ArrayToken : public KvoObject
{
public:
    explicit ArrayToken(const KvoToken::ActionTable& actions) : table(actions)
    {}

    void Read(std::istream& in) override
    {
        using Table = KvoToken::ActionTable;
        char c;
        while (in.get(c) && table.ActionOf(c) == Table::Blank)
            ;
        if (!in.fail())
            in.putback(c);
        for (in.get(c); !in.fail(); in.get(c)) {
            const int action = table.ActionOf(c);
            if (action & Table::Special) {
                if (!quote && text.size == 0)
                    text[0] = c;
                else
                    in.putback(c);
                break;
            }
            if (action == Table::Blank)
                break;
            if (action & Table::QuoteOrEscape)
                read_quoted(in, c);
            else
                text[text.size] = c;
        }
        text[text.size] = '\0';
    }

    bool Begins(const char* characters) const
    {
        return text[0] && std::strchr(characters, text[0]);
    }

    KvoCharArray text;
    char quote = 0;

private:
    void read_quoted(std::istream& in, char opening)
    {
        char c;
        quote = opening;
        if (quote == '\\') {
            if (in.get(c))
                text[text.size] = c;
        } else {
            while (in.get(c) && c != quote)
                text[text.size] = c;
        }
    }

    const KvoToken::ActionTable& table;
};

/// A statement of such tokens, each a new object.
class ArrayStatement
{
public:
    ~ArrayStatement() { tokens.DeleteContents(); }

    void Read(std::istream& in)
    {
        do {
            tokens.DeleteContents();
            read_run(in);
            if (!in.good())
                return;
            for (int i = 0; i < tokens.size; ++i) {
                if (at(i)->Begins("!#"))
                    while (tokens.size > i)
                        delete tokens.Pop();
                else if (at(i)->Begins("\n"))
                    delete tokens.Remove(i);
            }
        } while (tokens.size == 0);
    }

private:
    ArrayToken* at(int i) { return static_cast<ArrayToken*>(tokens[i]); }

    void read_run(std::istream& in)
    {
        while (in.good()) {
            auto* token = new ArrayToken(table);
            token->Read(in);
            if (!token->quote && (!token->text[0] || token->Begins(";\n"))) {
                delete token;
                return;
            }
            tokens.Insert(token, tokens.size);
        }
    }

    KvoToken::ActionTable table{"!;\n"};
    KvoObjArray tokens;
};

void read_all_into_arrays(std::istream& in)
{
    ArrayStatement statement;
    while (in.good())
        statement.Read(in);
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
BENCHMARK(from_memory<read_all_into_arrays>)->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all_literally>)->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all>)->Unit(benchmark::kMillisecond);

template <void (*Reader)(std::istream&)>
void from_file(benchmark::State& state)
{
    const std::string path =
        std::filesystem::temp_directory_path() / "zt_bench_tokenizer.zt";
    std::ofstream(path, std::ios::binary) << script();
    for (auto _ : state) {
        std::ifstream in(path);
        Reader(in);
    }
    std::filesystem::remove(path);
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

/// Statements of these words in an order that cannot be foreseen.
class Commands
{
public:
    Commands()
    {
        std::mt19937 dice(1);
        const std::vector<std::string> words = command_words();
        for (int i = 0; i < 4096; ++i)
            statements.emplace_back(words[dice() % words.size()].c_str());
    }

    KvoStatement& Next() { return statements[next++ % statements.size()]; }

private:
    std::vector<KvoStatement> statements;
    std::size_t next = 0;
};

class LiteralDirective : public ZtDirective
{
public:
    using ZtDirective::ZtDirective;
    int Compare(void* key) override
    {
        return strcasecmp(name, static_cast<const char*>(key));
    }
};

void dispatch_literally(benchmark::State& state)
{
    srandom(1);
    KvoSkipList directives;
    for (const std::string& word : command_words())
        directives.Insert(new LiteralDirective(word.c_str()));
    Commands commands;
    for (auto _ : state) {
        KvoStatement& statement = commands.Next();
        KvoObject* found = directives.Search(statement.ArgText(0));
        static_cast<ZtDirective*>(found)->Act(&statement);
    }
    directives.DeleteContents();
}
BENCHMARK(dispatch_literally);

void dispatch(benchmark::State& state)
{
    srandom(1);
    ZtDispatcher dispatcher;
    for (const std::string& word : command_words())
        dispatcher.Add(new ZtDirective(word.c_str()));
    Commands commands;
    for (auto _ : state)
        dispatcher.Delegate(&commands.Next());
}
BENCHMARK(dispatch);
} // namespace

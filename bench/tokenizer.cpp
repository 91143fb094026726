// How fast are statements read from memory and from a file, and how fast is one
// dispatched among many directives?
//
// Compared with the rules written down one `get` a character, twice: on plain
// strings and vectors, and on the library's own arrays, which grow by one, with
// a new object for each token.

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <strings.h>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef ZT_BENCH_TCL
#include <tcl.h>
#endif

#include "KVO/KvoStatement.h"
#include "ZT/directive.h"
#include "ZT/error.h"
#include "require.h"
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

/// Compares the tokens of the first megabyte with the literal reader's.
void require_same_tokens()
{
    const std::string text = script().substr(0, 1'000'000);
    std::istringstream here(text), there(text);
    const LiteralTokenizer tokenizer("!", ";\n");
    KvoStatement statement;
    std::vector<LiteralToken> literal;
    while (there.good()) {
        literal.clear();
        tokenizer.AppendStatement(there, literal);
        statement.Clear();
        statement.Read(here);
        bool same =
            static_cast<std::size_t>(statement.Count()) == literal.size();
        for (int i = 0; same && i < statement.Count(); ++i)
            same =
                literal[static_cast<std::size_t>(i)] ==
                LiteralToken{statement.ArgText(i), statement.Find(i)->Quote()};
        Require(same, "statements");
    }
}

template <void (*Reader)(std::istream&)>
void from_memory(benchmark::State& state)
{
    require_same_tokens();
    std::istringstream in(script());
    for (auto _ : state) {
        in.clear();
        in.seekg(0);
        Reader(in);
    }
    report_rate(state);
}
BENCHMARK(from_memory<read_all_into_arrays>)
    ->Name("statements_memory/literal")
    ->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all_literally>)
    ->Name("statements_memory/on std::string")
    ->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all>)
    ->Name("statements_memory/ours")
    ->Unit(benchmark::kMillisecond);
BENCHMARK(from_memory<read_all>)
    ->Name("statements_file/memory")
    ->Unit(benchmark::kMillisecond);

#ifdef ZT_BENCH_TCL
// The parser of a script language, over the same text: it splits it into
// commands and words and runs none of them.
void parse_with_tcl(benchmark::State& state)
{
    const std::string& text = script();
    for (auto _ : state) {
        const char* at = text.data();
        auto left = static_cast<int>(text.size());
        while (left > 0) {
            Tcl_Parse parse;
            if (Tcl_ParseCommand(nullptr, at, left, 0, &parse) != TCL_OK) {
                state.SkipWithError("the script does not parse");
                break;
            }
            const char* next = parse.commandStart + parse.commandSize;
            left -= static_cast<int>(next - at);
            at = next;
            benchmark::DoNotOptimize(parse.numWords);
            Tcl_FreeParse(&parse);
        }
    }
    report_rate(state);
}
BENCHMARK(parse_with_tcl)
    ->Name("statements_memory/tcl")
    ->Unit(benchmark::kMillisecond);
#endif

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
BENCHMARK(from_file<read_all>)
    ->Name("statements_file/ours")
    ->Unit(benchmark::kMillisecond);

std::vector<std::string> command_words(std::int64_t count)
{
    std::vector<std::string> words;
    const char* const stems[] = {"move",   "Rotate", "scale", "select", "key",
                                 "render", "Echo",   "light", "camera", "set"};
    for (std::int64_t i = 0; i < count; ++i)
        words.push_back(stems[i % 10] + std::to_string(i * 7919 % 100000));
    return words;
}

/// Statements of these words in an order that cannot be foreseen.
class Commands
{
public:
    explicit Commands(std::int64_t count)
    {
        std::mt19937 dice(1);
        const std::vector<std::string> words = command_words(count);
        for (int i = 0; i < 4096; ++i)
            statements.emplace_back(words[dice() % words.size()].c_str());
    }

    KvoStatement& Next() { return statements[next++ % statements.size()]; }

private:
    std::vector<KvoStatement> statements;
    std::size_t next = 0;
};

template <class Directive>
class LiteralDirective : public Directive
{
public:
    using Directive::Directive;
    int Compare(void* key) override
    {
        return strcasecmp(this->name, static_cast<const char*>(key));
    }
};

void delegate_literally(KvoSkipList& directives, KvoStatement& statement)
{
    if (KvoObject* found = directives.Search(statement.ArgText(0)))
        static_cast<ZtDirective*>(found)->Act(&statement);
}

/// Notes what it was called for.
class NotingDirector : public ZtDirector
{
public:
    struct Call
    {
        const KvoStatement* statement = nullptr;
        int selector = -1;
        bool operator==(const Call&) const = default;
    };

    using ZtDirector::ZtDirector;
    void Act(KvoStatement* statement, int selector) override
    {
        calls.push_back({statement, selector});
    }

    std::vector<Call> calls;
};

/// Keeps what is posted.
class Reader : public ZtErrHandler
{
public:
    void Handle(ZtErr* error) override
    {
        text += error->Message();
        delete error;
    }

    std::string text;
};

/// Every word as it is, in capitals, in small letters, cut short, made longer.
std::vector<std::string> words_to_try(const std::vector<std::string>& known)
{
    std::vector<std::string> words = {"", "e", "frobnicate", "\xE9"};
    for (const std::string& word : known) {
        std::string capitals, small;
        for (const char c : word) {
            capitals += static_cast<char>(std::toupper(c));
            small += static_cast<char>(std::tolower(c));
        }
        words.insert(words.end(),
                     {word, capitals, small, word + "0",
                      word.substr(0, word.size() - 1), word.substr(0, 3)});
    }
    return words;
}

/// Compares which directives are called, and with which statement, or that an
/// unknown word is reported: twice over, since a dispatcher looks for the first
/// words in another way than for those after them. Once for each number of
/// directives.
void require_same_calls(std::int64_t count)
{
    static std::set<std::int64_t> agreed;
    if (!agreed.insert(count).second)
        return;
    srandom(1);
    ZtDispatcher dispatcher;
    NotingDirector ours(dispatcher), literal(dispatcher);
    KvoSkipList directives;
    const std::vector<std::string> known = command_words(count);
    for (int i = 0; i < static_cast<int>(known.size()); ++i) {
        const char* word = known[static_cast<std::size_t>(i)].c_str();
        ours.AddDirective(i, word);
        directives.Insert(
            new LiteralDirective<ZtDirector::Directive>(word, literal, i));
    }
    Reader reports;
    for (int round = 0; round < 2; ++round)
        for (const std::string& word : words_to_try(known)) {
            KvoStatement statement(word.c_str());
            ours.calls.clear();
            literal.calls.clear();
            reports.text.clear();
            dispatcher.Delegate(&statement);
            delegate_literally(directives, statement);
            const std::string report =
                literal.calls.empty()
                    ? "Warning: Unknown command: " + word + "\n"
                    : "";
            Require(ours.calls == literal.calls && reports.text == report,
                    "dispatch");
        }
    directives.DeleteContents();
}

void dispatch_literally(benchmark::State& state)
{
    require_same_calls(state.range(0));
    srandom(1);
    KvoSkipList directives;
    for (const std::string& word : command_words(state.range(0)))
        directives.Insert(new LiteralDirective<ZtDirective>(word.c_str()));
    Commands commands(state.range(0));
    for (auto _ : state)
        delegate_literally(directives, commands.Next());
    directives.DeleteContents();
}
BENCHMARK(dispatch_literally)->Name("dispatch/literal")->Arg(200);

void dispatch(benchmark::State& state)
{
    require_same_calls(state.range(0));
    srandom(1);
    ZtDispatcher dispatcher;
    for (const std::string& word : command_words(state.range(0)))
        dispatcher.Add(new ZtDirective(word.c_str()));
    Commands commands(state.range(0));
    for (auto _ : state)
        dispatcher.Delegate(&commands.Next());
}
BENCHMARK(dispatch)->Name("dispatch/ours")->Arg(200);
BENCHMARK(dispatch)
    ->Name("curve/dispatch/ours")
    ->RangeMultiplier(8)
    ->Range(8, 1 << 15);
BENCHMARK(dispatch_literally)
    ->Name("curve/dispatch/literal")
    ->RangeMultiplier(8)
    ->Range(8, 1 << 15);
} // namespace

#include "ZT/directive.h"

#include <cctype>
#include <functional>
#include <memory>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "command/directive_index.h"
#include "support/ErrorTrap.h"
#include "support/FailingMemory.h"
#include "support/OtherLocale.h"

namespace {
using Texts = std::vector<std::string>;

/// Writes down what it is asked to act on: its label and the statement.
class Scribe : public ZtDirective
{
public:
    Scribe(const char* command_word, Texts& notes_to_add_to, std::string label)
        : ZtDirective(command_word), notes(notes_to_add_to),
          mark(std::move(label))
    {}

    void Act(KvoStatement* statement) override
    {
        std::ostringstream text;
        statement->Write(text);
        notes.push_back(mark + ": " + text.str());
    }

private:
    Texts& notes;
    std::string mark;
};

/// Does what it is told to.
class Doer : public ZtDirective
{
public:
    Doer(const char* command_word, std::function<void(KvoStatement*)> deed)
        : ZtDirective(command_word), action(std::move(deed))
    {}
    void Act(KvoStatement* statement) override { action(statement); }

private:
    std::function<void(KvoStatement*)> action;
};

/// Counts those that are alive.
class Mortal : public ZtDirective
{
public:
    explicit Mortal(const char* command_word) : ZtDirective(command_word)
    {
        ++alive;
    }
    ~Mortal() override { --alive; }
    static int alive;
};
int Mortal::alive = 0;

void delegate(ZtDispatcher& dispatcher, const std::string& line)
{
    std::istringstream in(line + "\n");
    KvoStatement statement;
    statement.Read(in);
    dispatcher.Delegate(&statement);
}

std::string info_of(ZtDispatcher& dispatcher)
{
    std::ostringstream out;
    dispatcher.Info(out, 0);
    return out.str();
}

TEST(ZtDirective, CopiesItsName)
{
    std::string name = "Echo";

    ZtDirective directive(name.c_str());
    name = "other";

    EXPECT_STREQ(directive.name, "Echo");
    EXPECT_STREQ(static_cast<const char*>(directive.Key()), "Echo");
    EXPECT_STREQ(ZtDirective(nullptr).name, "");
    EXPECT_STREQ(directive.ClassName(), "KvoNamedObject");
}

TEST(ZtDirective, ComparesItsNameWithoutRegardToCase)
{
    ZtDirective directive("Echo");

    EXPECT_EQ(directive.Compare(const_cast<char*>("eCHO")), 0);
    EXPECT_LT(directive.Compare(const_cast<char*>("ECHOES")), 0);
    EXPECT_GT(directive.Compare(const_cast<char*>("CD")), 0);
    EXPECT_GT(directive.Compare(nullptr), 0);
    EXPECT_EQ(ZtDirective("").Compare(nullptr), 0);
}

TEST(ZtDirective, DoesNothingByItself)
{
    ZtDirective directive("Echo");
    KvoStatement statement("Echo");
    ErrorTrap reports;

    directive.Act(&statement);

    EXPECT_EQ(statement.Count(), 1);
    EXPECT_EQ(reports.Text(), "");
}

TEST(ZtDirective, InfoWritesItsNameIndented)
{
    ZtDirective directive("Echo");
    std::ostringstream out;

    directive.Info(out, 7);

    EXPECT_EQ(out.str(), "    Echo\n");
}

TEST(ZtDispatcher, FindsADirectiveWhateverTheCase)
{
    Texts notes;
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("Include", notes, "Include"));

    delegate(dispatcher, "include a");
    delegate(dispatcher, "INCLUDE b");
    delegate(dispatcher, "Include c");

    EXPECT_EQ(notes, (Texts{"Include: include a", "Include: INCLUDE b",
                            "Include: Include c"}));
}

TEST(ZtDispatcher, FindsADirectiveInEveryLocale)
{
    const OtherLocale locale("tr_TR");
    Texts notes;
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("INCLUDE", notes, "Include"));

    delegate(dispatcher, "include");

    EXPECT_EQ(notes.size(), 1u);
}

TEST(ZtDispatcher, OfNamesEqualButForCaseTheFirstAddedIsFound)
{
    Texts notes;
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("echo", notes, "first"));
    dispatcher.Add(new Scribe("Echo", notes, "second"));
    dispatcher.Add(new Scribe("ECHO", notes, "third"));

    for (int i = 0; i < 10; ++i)
        delegate(dispatcher, "ECHO");

    EXPECT_EQ(notes, Texts(10, "first: ECHO"));
}

TEST(ZtDispatcher, WarnsOfAnUnknownCommandAndGoesOn)
{
    Texts notes;
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("echo", notes, "echo"));
    ErrorTrap reports;

    delegate(dispatcher, "frobnicate x   'y z'");
    delegate(dispatcher, "echo");

    ASSERT_EQ(reports.reports.size(), 1u);
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: frobnicate x y z\n");
    EXPECT_EQ(reports.reports[0].code, 0);
    EXPECT_EQ(reports.reports[0].level, 3);
    EXPECT_EQ(notes.size(), 1u);
}

TEST(ZtDispatcher, WithoutDirectivesEveryCommandIsUnknown)
{
    ZtDispatcher dispatcher;
    ErrorTrap reports;

    delegate(dispatcher, "a");
    delegate(dispatcher, "a");

    EXPECT_EQ(reports.Text(), "Warning: Unknown command: a\n"
                              "Warning: Unknown command: a\n");
}

TEST(ZtDispatcher, AStatementWithoutWordsIsSeenByTheEachDirectivesOnly)
{
    Texts notes;
    Scribe each("each", notes, "each");
    ZtDispatcher dispatcher;
    dispatcher.EachAdd(&each);
    KvoStatement empty;
    ErrorTrap reports;

    dispatcher.Delegate(&empty);
    dispatcher.Delegate(nullptr);

    EXPECT_EQ(notes, (Texts{"each: "}));
    EXPECT_EQ(reports.Text(), "");
}

TEST(ZtDispatcher, EachDirectivesSeeEveryStatementFirstInOrder)
{
    Texts notes;
    Scribe first("zzz", notes, "first");
    Scribe second("aaa", notes, "second");
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("echo", notes, "echo"));
    dispatcher.EachAdd(&first);
    dispatcher.EachAdd(&second);
    ErrorTrap reports;

    delegate(dispatcher, "echo x");
    delegate(dispatcher, "nothing");

    EXPECT_EQ(notes, (Texts{"first: echo x", "second: echo x", "echo: echo x",
                            "first: nothing", "second: nothing"}));
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: nothing\n");
}

TEST(ZtDispatcher, EachSeesTheStatementAsTheOneBeforeLeftIt)
{
    Texts notes;
    Doer renames("each", [](KvoStatement* s) { s->Replace(0, "echo"); });
    Scribe watches("each", notes, "each");
    ZtDispatcher dispatcher;
    dispatcher.Add(new Scribe("echo", notes, "echo"));
    dispatcher.EachAdd(&renames);
    dispatcher.EachAdd(&watches);

    delegate(dispatcher, "say x");

    EXPECT_EQ(notes, (Texts{"each: echo x", "echo: echo x"}));
}

TEST(ZtDispatcher, AnEachDirectiveThatEatsAllWordsEndsItSilently)
{
    Doer eats("each", [](KvoStatement* s) { s->Clear(); });
    ZtDispatcher dispatcher;
    dispatcher.EachAdd(&eats);
    ErrorTrap reports;

    delegate(dispatcher, "unknown");

    EXPECT_EQ(reports.Text(), "");
}

TEST(ZtDispatcher, EachDirectivesComeAndGoWhileTheyAct)
{
    Texts notes;
    ZtDispatcher dispatcher;
    Scribe late("each", notes, "late");
    Doer once("each", [&](KvoStatement*) { dispatcher.EachAdd(&late); });
    Doer last("each", [&](KvoStatement*) {
        dispatcher.EachRemove(&once);
        dispatcher.EachRemove(&last);
    });
    dispatcher.Add(new ZtDirective("x"));
    dispatcher.EachAdd(&once);
    dispatcher.EachAdd(&last);

    // `last` takes both out and stands before `late`, which moves to the front.
    delegate(dispatcher, "x 1");
    delegate(dispatcher, "x 2");

    EXPECT_EQ(notes, (Texts{"late: x 2"}));
}

TEST(ZtDispatcher, EachRemoveTakesTheFirstRegistrationOnly)
{
    Texts notes;
    Scribe each("each", notes, "each");
    ZtDispatcher dispatcher;
    dispatcher.Add(new ZtDirective("x"));
    dispatcher.EachAdd(&each);
    dispatcher.EachAdd(&each);
    dispatcher.EachAdd(nullptr);

    delegate(dispatcher, "x 1");
    dispatcher.EachRemove(&each);
    delegate(dispatcher, "x 2");
    dispatcher.EachRemove(&each);
    dispatcher.EachRemove(&each);
    dispatcher.EachRemove(nullptr);
    delegate(dispatcher, "x 3");

    EXPECT_EQ(notes, (Texts{"each: x 1", "each: x 1", "each: x 2"}));
}

TEST(ZtDispatcher, RemoveGivesADirectiveBack)
{
    Texts notes;
    Scribe stays("echo", notes, "stays");
    ErrorTrap reports;
    {
        ZtDispatcher dispatcher;
        dispatcher.Add(&stays);
        for (int i = 0; i < 3; ++i)
            delegate(dispatcher, "echo");

        dispatcher.Remove(&stays);
        dispatcher.Remove(&stays);
        dispatcher.Remove(nullptr);
        dispatcher.Add(nullptr);
        delegate(dispatcher, "echo");
    }

    EXPECT_EQ(notes.size(), 3u);
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: echo\n");
    EXPECT_STREQ(stays.name, "echo");
}

TEST(ZtDispatcher, DeletesItsNamedDirectivesAndNoOthers)
{
    auto each = std::make_unique<Mortal>("each");
    {
        ZtDispatcher dispatcher;
        dispatcher.Add(new Mortal("a"));
        dispatcher.Add(new Mortal("b"));
        dispatcher.EachAdd(each.get());
        EXPECT_EQ(Mortal::alive, 3);
    }

    EXPECT_EQ(Mortal::alive, 1);
}

TEST(ZtDispatcher, DirectivesMayChangeTheDispatcherWhileTheyAct)
{
    Texts notes;
    ZtDispatcher dispatcher;
    auto* self = new Doer("self", [&](KvoStatement*) {
        notes.emplace_back("self");
        dispatcher.Add(new Scribe("added", notes, "added"));
    });
    dispatcher.Add(self);
    ErrorTrap reports;

    for (int i = 0; i < 3; ++i)
        delegate(dispatcher, "self");
    delegate(dispatcher, "added");
    dispatcher.Remove(self);
    delete self;
    delegate(dispatcher, "self");
    delegate(dispatcher, "added");

    EXPECT_EQ(notes,
              (Texts{"self", "self", "self", "added: added", "added: added"}));
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: self\n");
}

TEST(ZtDispatcher, ANameThatIsChangedInPlaceCountsAtOnce)
{
    Texts notes;
    ZtDispatcher dispatcher;
    auto* first = new Scribe("move", notes, "first");
    auto* second = new Scribe("movf", notes, "second");
    dispatcher.Add(first);
    dispatcher.Add(second);
    ErrorTrap reports;
    for (int i = 0; i < 5; ++i)
        delegate(dispatcher, "movf");
    notes.clear();

    second->SetName("movg");
    delegate(dispatcher, "movf");
    delegate(dispatcher, "MOVG");
    first->SetName("movg");
    delegate(dispatcher, "movg");

    EXPECT_EQ(notes, (Texts{"second: MOVG", "first: movg"}));
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: movf\n");
}

TEST(ZtDispatcher, ANeighbourThatTakesTheSameNameIsFoundFirst)
{
    Texts notes;
    ZtDispatcher dispatcher;
    auto* first = new Scribe("move", notes, "first");
    dispatcher.Add(first);
    dispatcher.Add(new Scribe("movf", notes, "second"));
    for (int i = 0; i < 5; ++i)
        delegate(dispatcher, "movf");
    notes.clear();

    first->SetName("MOVF");
    delegate(dispatcher, "movf");

    EXPECT_EQ(notes, (Texts{"first: movf"}));
}

TEST(ZtDispatcher, InfoListsNamedDirectivesInTheOrderOfTheirNames)
{
    Texts notes;
    Scribe each("each", notes, "each");
    ZtDispatcher dispatcher;
    for (const char* name : {"Timer", "Echo", "Include", "cd", "System"})
        dispatcher.Add(new ZtDirective(name));
    dispatcher.EachAdd(&each);

    EXPECT_EQ(info_of(dispatcher),
              "    cd\n    Echo\n    Include\n    System\n    Timer\n");
}

TEST(ZtDispatcher, InfoOfNothingIsNothing)
{
    ZtDispatcher dispatcher;

    EXPECT_EQ(info_of(dispatcher), "");
}

TEST(ZtDispatcher, InfoPassesItsNumberOn)
{
    class Numbered : public ZtDirective
    {
    public:
        using ZtDirective::ZtDirective;
        void Info(std::ostream& out, int number) override { out << number; }
    };
    ZtDispatcher dispatcher;
    dispatcher.Add(new Numbered("x"));
    std::ostringstream out;

    dispatcher.Info(out, 42);

    EXPECT_EQ(out.str(), "42");
}

TEST(ZtDispatcher, InfoIsNotDisturbedBySearchesOfADirective)
{
    class Searching : public ZtDirective
    {
    public:
        Searching(const char* word, ZtDispatcher& home)
            : ZtDirective(word), dispatcher(home)
        {}
        void Info(std::ostream& out, int number) override
        {
            KvoStatement statement("a");
            dispatcher.Delegate(&statement);
            ZtDirective::Info(out, number);
        }

    private:
        ZtDispatcher& dispatcher;
    };
    ZtDispatcher dispatcher;
    for (const char* name : {"a", "b", "c"})
        dispatcher.Add(new Searching(name, dispatcher));

    EXPECT_EQ(info_of(dispatcher), "    a\n    b\n    c\n");
}

TEST(ZtDispatcher, FindsWhatAWalkThroughAllDirectivesFinds)
{
    std::mt19937 dice(11);
    Texts notes;
    ZtDispatcher dispatcher;
    std::vector<std::pair<std::string, ZtDirective*>> model;
    const auto folded = [](std::string text) {
        for (char& c : text)
            c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        return text;
    };
    const auto random_word = [&] {
        std::string word;
        for (auto i = dice() % 3 + 1; i > 0; --i)
            word += "abcABC"[dice() % 6];
        return word;
    };
    ErrorTrap reports;

    for (int step = 0; step < 20000; ++step) {
        const std::string word = random_word();
        const auto choice = dice() % 100;
        if (choice < 2) {
            auto* made = new Scribe(word.c_str(), notes, std::to_string(step));
            dispatcher.Add(made);
            model.emplace_back(word, made);
        } else if (choice < 4 && !model.empty()) {
            const auto victim = model.begin() + static_cast<std::ptrdiff_t>(
                                                    dice() % model.size());
            dispatcher.Remove(victim->second);
            delete victim->second;
            model.erase(victim);
        } else {
            KvoStatement statement(word.c_str());
            Texts expected;
            for (const auto& [name, directive] : model)
                if (folded(name) == folded(word)) {
                    directive->Act(&statement);
                    expected.swap(notes);
                    break;
                }
            notes.clear();

            dispatcher.Delegate(&statement);

            ASSERT_EQ(notes, expected) << word << " at step " << step;
            notes.clear();
        }
    }
}

TEST(DirectiveIndex, IsAskedOnlyAfterAsManySearchesAsThereAreDirectives)
{
    KvoSkipList list;
    list.Insert(new ZtDirective("a"));
    list.Insert(new ZtDirective("b"));
    list.Insert(new ZtDirective("c"));
    zt_command::DirectiveIndex index;

    EXPECT_EQ(index.Find(list, "b"), nullptr);
    EXPECT_EQ(index.Find(list, "b"), nullptr);
    EXPECT_EQ(index.Find(list, "B"), list.Search("b"));
    EXPECT_EQ(index.Find(list, "d"), nullptr);
    index.Forget();
    EXPECT_EQ(index.Find(list, "b"), nullptr);
    list.DeleteContents();
}

TEST(DirectiveIndex, OfAnEmptyListFindsNothing)
{
    const KvoSkipList list;
    zt_command::DirectiveIndex index;

    EXPECT_EQ(index.Find(list, "a"), nullptr);
    EXPECT_EQ(index.Find(list, "a"), nullptr);
}

/// Writes down each call with its selector.
class Switchboard : public ZtDirector
{
public:
    using ZtDirector::ZtDirector;
    void Act(KvoStatement* statement, int selector) override
    {
        std::ostringstream text;
        statement->Write(text);
        notes.push_back(std::to_string(selector) + ": " + text.str());
    }
    void Info(std::ostream& out, char* name, int selector, int number) override
    {
        out << name << " " << selector << " " << number << "\n";
    }
    Texts notes;
};

TEST(ZtDirector, ItsDirectivesComeBackWithTheirSelectors)
{
    ZtDispatcher dispatcher;
    Switchboard director(dispatcher);
    director.AddDirective(4, "Open");
    director.AddDirective(-1, "Close");

    delegate(dispatcher, "open a");
    delegate(dispatcher, "CLOSE b");

    EXPECT_EQ(director.notes, (Texts{"4: open a", "-1: CLOSE b"}));
}

TEST(ZtDirector, AddEachSeesEveryStatementUnderItsSelector)
{
    ZtDispatcher dispatcher;
    Switchboard director(dispatcher);
    director.AddDirective(1, "open");
    director.AddEach(2);
    director.AddEach(3);
    ErrorTrap reports;

    delegate(dispatcher, "open a");
    delegate(dispatcher, "each");

    EXPECT_EQ(director.notes, (Texts{"2: open a", "3: open a", "1: open a",
                                     "2: each", "3: each"}));
    EXPECT_EQ(reports.Text(), "Warning: Unknown command: each\n");
}

TEST(ZtDirector, InfoOfTheDispatcherAsksTheDirector)
{
    ZtDispatcher dispatcher;
    Switchboard director(dispatcher);
    director.AddDirective(4, "Open");
    director.AddEach(5);
    std::ostringstream out;

    dispatcher.Info(out, 9);

    EXPECT_EQ(out.str(), "Open 4 9\n");
}

TEST(ZtDirector, WarnsByItselfThatNothingIsHandled)
{
    ZtDispatcher dispatcher;
    ZtDirector director(dispatcher);
    director.AddDirective(12345, "Open");
    ErrorTrap reports;

    delegate(dispatcher, "open 'a b' c");
    director.Act(nullptr, 0);

    ASSERT_EQ(reports.reports.size(), 2u);
    EXPECT_EQ(reports.reports[0].text,
              "Warning: Command: open a b c\n"
              "    Not handled by director, selector = 12345\n");
    EXPECT_EQ(reports.reports[0].code, 0);
    EXPECT_EQ(reports.reports[0].level, 3);
    EXPECT_EQ(reports.reports[1].text,
              "Warning: Command: \n"
              "    Not handled by director, selector = 0\n");
}

TEST(ZtDirector, WarnsTheSameInEveryLocale)
{
    const OtherLocale locale("de_DE");
    ZtDispatcher dispatcher;
    ZtDirector director(dispatcher);
    KvoStatement statement("open");
    ErrorTrap reports;

    director.Act(&statement, 1234567);

    EXPECT_EQ(reports.Text(),
              "Warning: Command: open\n"
              "    Not handled by director, selector = 1234567\n");
}

TEST(ZtDirector, InfoWritesTheNameIndented)
{
    ZtDispatcher dispatcher;
    ZtDirector director(dispatcher);
    director.AddDirective(1, "Open");

    EXPECT_EQ(info_of(dispatcher), "    Open\n");
}

TEST(ZtDirector, IsAPlainObjectToClassInformation)
{
    ZtDispatcher dispatcher;
    ZtDirector director(dispatcher);
    ZtDirector::Directive directive("Open", director, 1);

    EXPECT_STREQ(dispatcher.ClassName(), "KvoObject");
    EXPECT_STREQ(director.ClassName(), "KvoObject");
    EXPECT_STREQ(directive.ClassName(), "KvoNamedObject");
}

// Each directive has one owner: what is deleted twice ends the process here,
// what is never deleted is found by the leak checker.
TEST(ZtDirector, MayGoBeforeOrAfterItsDispatcher)
{
    for (const bool director_first : {true, false}) {
        auto dispatcher = std::make_unique<ZtDispatcher>();
        auto director = std::make_unique<Switchboard>(*dispatcher);
        director->AddDirective(1, "open");
        director->AddEach(2);
        delegate(*dispatcher, "open");
        EXPECT_EQ(director->notes, (Texts{"2: open", "1: open"}));

        if (director_first)
            director.reset();
        dispatcher.reset();
    }
}

TEST(ZtDispatcher, WithoutMemoryNothingIsRegisteredAndNothingThrows)
{
    ZtDispatcher dispatcher;
    ZtDirector director(dispatcher);
    KvoStatement statement("open");
    {
        const FailingMemory memory;
        director.AddDirective(1, "open");
        director.AddEach(2);
        dispatcher.Delegate(&statement);
    }

    EXPECT_TRUE(FailingMemory::Failed());
    EXPECT_EQ(info_of(dispatcher), "");
}

TEST(ZtDispatcher, WithoutMemoryForItsIndexItFindsDirectivesAllTheSame)
{
    std::unique_ptr<ZtDispatcher> dispatcher;
    alignas(ZtDispatcher) static unsigned char place[sizeof(ZtDispatcher)];
    ZtDispatcher* made = nullptr;
    {
        const FailingMemory memory;
        made = new (place) ZtDispatcher;
    }
    Texts notes;

    made->Add(new Scribe("echo", notes, "echo"));
    delegate(*made, "echo");
    delegate(*made, "ECHO");

    EXPECT_EQ(notes, (Texts{"echo: echo", "echo: ECHO"}));
    made->~ZtDispatcher();
}
} // namespace

#include "ZT/dircom.h"

#include <cstring>
#include <fstream>
#include <initializer_list>
#include <iostream>
#include <new>
#include <sstream>
#include <string>
#include <utility>

#include "core/number_text.h"
#include "core/write_text.h"
#include "platform/process.h"

namespace {
void say(std::initializer_list<const char*> texts)
{
    for (const char* text : texts)
        zt_core::write_text(std::cerr, text);
}

void run_script(std::istream& in, ZtDispatcher& dispatcher)
{
    KvoStatement statement;
    statement.Read(in);
    while (in.good() && statement.Count() > 0) {
        dispatcher.Delegate(&statement);
        statement.Read(in);
    }
}

bool open_script(std::ifstream& in, const char* name)
{
    try {
        in.open(name);
    } catch (const std::bad_alloc&) {
        return false;
    }
    return in.is_open();
}
} // namespace

ZtCommonDirectives::ZtCommonDirectives(ZtDispatcher& home_dispatcher)
    : ZtDirector(home_dispatcher), stopwatch(1.0)
{
    AddDirective(Timer, "Timer");
    AddDirective(Echo, "Echo");
    AddDirective(Included, "Include");
    AddDirective(ChangeDirectory, "cd");
    AddDirective(Shell, "System");
}

ZtCommonDirectives::~ZtCommonDirectives() = default;

void ZtCommonDirectives::Act(KvoStatement* statement, int selector)
{
    if (!statement)
        return;
    switch (selector) {
    case Timer:
        statement->EatArg(0);
        statement->Write(std::cerr);
        say({" ", zt_core::float_to_text(stopwatch.Mark()).c_str(), "\n"});
        break;
    case Echo:
        statement->EatArg(0);
        statement->Write(std::cerr);
        say({"\n"});
        break;
    case Included:
        Include(statement->ArgText(1));
        break;
    case ChangeDirectory:
        if (const char* const directory = statement->ArgText(1))
            zt_platform::Processes::current().change_directory(directory);
        break;
    case Shell:
        System(statement);
        break;
    default:
        break;
    }
}

void ZtCommonDirectives::Include(const char* name)
{
    if (!name || std::strcmp(name, "-") == 0) {
        run_script(std::cin, dispatcher);
        return;
    }
    std::ifstream in;
    if (open_script(in, name))
        run_script(in, dispatcher);
    else
        say({"Error - ZtDispatcher: Cannot open file ", name, "\n"});
}

void ZtCommonDirectives::System(KvoStatement* statement)
{
    if (!statement)
        return;
    statement->EatArg(0);
    std::ostringstream words;
    statement->Write(words);
    words << "\n";
    if (!words.good())
        return;
    const std::string command = std::move(words).str();
    zt_platform::Processes::current().run_shell(command.c_str());
}

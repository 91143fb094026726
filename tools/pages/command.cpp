#include "pages/command.h"

#include <algorithm>

#include <CLI/CLI.hpp>

namespace zt_pages {

namespace {

Option option_of(const CLI::Option& source)
{
    Option option;
    for (const std::string& name : source.get_snames())
        option.names.push_back("-" + name);
    for (const std::string& name : source.get_lnames())
        option.names.push_back("--" + name);
    if (source.get_items_expected_max() > 0) {
        option.value = source.get_option_text();
        if (option.value.empty())
            option.value = source.get_type_name();
    }
    option.help = source.get_description();
    option.repeats = source.get_items_expected_max() > 1;
    return option;
}

} // namespace

Option* Command::Find(const std::string& wanted)
{
    for (Option& option : options)
        if (std::find(option.names.begin(), option.names.end(), wanted) !=
            option.names.end())
            return &option;
    return nullptr;
}

Command CommandOf(const CLI::App& app)
{
    Command command;
    command.name = app.get_name();
    command.purpose = app.get_description();
    command.footer = app.get_footer();
    for (const CLI::Option* source : app.get_options()) {
        if (source->nonpositional()) {
            if (!source->get_group().empty())
                command.options.push_back(option_of(*source));
        } else {
            command.words = option_of(*source);
            command.words.value = source->get_name();
        }
    }
    return command;
}

void AddPageOption(CLI::App& app, std::string& kind)
{
    app.add_option("--page", kind, "Writes a page about the program")
        ->check(CLI::IsMember({"man", "bash", "zsh", "fish"}))
        ->group("");
}

} // namespace zt_pages

#include "words/preference_words.h"

#include <KVO/KvoPrefs.h>
#include <ZT/error.h>

#include <cstring>
#include <iostream>
#include <string>

#include "words/time_arguments.h"

namespace ztsh {

namespace {

enum Selector : int { Directories, Preference, Preferences, Project, WorkEnv };

const std::vector<Word> words = {
    {"Directories", "",
     "Lists the project's directories and the one of the help.", 0, 0},
    {"Preference", "NAME [VALUE | into VARIABLE]",
     "Says what the installation's variable NAME is, which is looked up in\n"
     "the environment and then by the query program; sets it to VALUE; or\n"
     "puts it into a variable of the script.",
     1, 3},
    {"Preferences", "",
     "Lists the installation's variables: name, where the value comes\n"
     "from, value. Those of the project's directories are looked up.",
     0, 0},
    {"Project", "[NAME]",
     "Sets the project, or says which it is. The empty name, \"\", is the\n"
     "installation's default.",
     0, 1},
    {"WorkEnv", "[DIRECTORY]",
     "Sets the work environment, or says which it is. The empty name, \"\",\n"
     "is the directory that the shell is in.",
     0, 1},
};

/// A directory as it is listed.
struct NamedDirectory
{
    const char* name;
    const char* (*directory)();
};

constexpr NamedDirectory directories[] = {
    {"project", KvoPrefs::ProjectDir}, {"wire", KvoPrefs::WireDir},
    {"pix", KvoPrefs::PixDir},         {"misc", KvoPrefs::MiscDir},
    {"stage", KvoPrefs::StageDir},     {"sla", KvoPrefs::SLADir},
    {"sdl", KvoPrefs::SDLDir},         {"anim", KvoPrefs::AnimDir},
    {"shader", KvoPrefs::ShaderDir},   {"texture", KvoPrefs::TextureDir},
    {"option", KvoPrefs::OptionDir},   {"plot", KvoPrefs::PlotDir},
    {"help", KvoPrefs::HelpDir},
};

/// A setting that the library keeps beside its table of variables.
struct Setting
{
    const char* name;
    KvoPrefs::Setting setting;
    const char* (*value)();
    void (*set)(const char* value); ///< Null for what a start settles.
};

constexpr Setting settings[] = {
    {"QUARN_LOCATION", KvoPrefs::Setting::Location,
     []() -> const char* { return KvoPrefs::location; }, nullptr},
    {"QUARN_DEFAULT_PROJECT", KvoPrefs::Setting::DefaultProject,
     []() -> const char* { return KvoPrefs::default_project; }, nullptr},
    {"QUARN_PROJECT", KvoPrefs::Setting::Project, KvoPrefs::Project,
     KvoPrefs::SetProject},
    {"QUARN_WORKENV", KvoPrefs::Setting::WorkEnv, KvoPrefs::WorkEnv,
     KvoPrefs::SetWorkEnv},
};

/// The setting of that name; null if the table has it.
const Setting* setting_of(const char* name)
{
    for (const Setting& setting : settings)
        if (std::strcmp(setting.name, name) == 0)
            return &setting;
    return nullptr;
}

const char* text_of(KvoPrefs::Origin origin)
{
    switch (origin) {
    case KvoPrefs::Origin::Environment:
        return "environment";
    case KvoPrefs::Origin::QueryProgram:
        return "query program";
    case KvoPrefs::Origin::Default:
        return "default";
    case KvoPrefs::Origin::SetHere:
        return "set here";
    case KvoPrefs::Origin::Nowhere:
        return "nowhere";
    case KvoPrefs::Origin::NotAsked:
        break;
    }
    return "not asked";
}

/// Null for the empty text.
const char* null_if_empty(const char* text)
{
    return *text ? text : nullptr;
}

const char* value_of(const char* name)
{
    const Setting* setting = setting_of(name);
    return setting ? setting->value() : KvoPrefs::Variable(name, nullptr);
}

/// The text with blanks behind it, if anything else is to follow.
std::string padded(const char* text, std::size_t width, const char* next)
{
    std::string column = text;
    if (*next != '\0' && column.size() < width)
        column.resize(width, ' ');
    return column;
}

void list_directories()
{
    for (const NamedDirectory& named : directories) {
        const char* path = named.directory();
        std::cout << "    " << padded(named.name, 8, path) << path << "\n";
    }
}

void list(const char* name, KvoPrefs::Origin origin, const char* value)
{
    std::cout << "    " << padded(name, 22, " ") << " "
              << padded(text_of(origin), 14, value) << value << "\n";
}

void list_preferences()
{
    for (const NamedDirectory& named : directories)
        named.directory();
    for (const Setting& setting : settings)
        list(setting.name, KvoPrefs::OriginOf(setting.setting),
             setting.value());
    const KvoSkipList& table = KvoPrefs::Table();
    for (KvoObject* object = table.Head(); object; object = table.Next()) {
        auto* variable = static_cast<KvoPrefs::TableEntry*>(object);
        const char* value = variable->Value();
        list(variable->name, variable->ValueOrigin(), value);
    }
}

} // namespace

PreferenceWords::PreferenceWords(Runner& script_runner)
    : WordDirector(script_runner.dispatcher, words), runner(script_runner)
{}

void PreferenceWords::Do(KvoStatement& statement, int selector)
{
    const char* first = statement.ArgText(1);
    switch (selector) {
    case Directories:
        list_directories();
        break;
    case Preference:
        preference(statement);
        break;
    case Preferences:
        list_preferences();
        break;
    case Project:
        if (!first)
            std::cout << KvoPrefs::Project() << "\n";
        else if (!InSequence(runner, "Project"))
            KvoPrefs::SetProject(null_if_empty(first));
        break;
    case WorkEnv:
        if (!first)
            std::cout << KvoPrefs::WorkEnv() << "\n";
        else if (!InSequence(runner, "WorkEnv"))
            KvoPrefs::SetWorkEnv(null_if_empty(first));
        break;
    default:
        break;
    }
}

void PreferenceWords::preference(const KvoStatement& statement)
{
    constexpr int asks = 2, sets = 3, stores = 4;
    const char* name = statement.ArgText(1);
    const char* second = statement.ArgText(2);
    const char* third = statement.ArgText(3);
    if (statement.Count() == asks)
        std::cout << value_of(name) << "\n";
    else if (statement.Count() == sets)
        set(name, second);
    else if (statement.Count() == stores && std::strcmp(second, "into") == 0 &&
             Variables::IsName(third))
        runner.variables.Set(third, value_of(name));
    else
        Expected(Preference);
}

void PreferenceWords::set(const char* name, const char* value)
{
    if (InSequence(runner, "Preference"))
        return;
    const Setting* setting = setting_of(name);
    if (!setting)
        KvoPrefs::SetVariable(name, value);
    else if (setting->set)
        setting->set(value);
    else
        ZtError("Preference: %s is settled when the shell starts\n", name);
}

} // namespace ztsh

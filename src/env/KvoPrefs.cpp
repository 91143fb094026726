#include "KVO/KvoPrefs.h"

#include <array>
#include <cstdlib>
#include <cstring>
#include <new>

#include "ZT/util.h"

#include "env/query_program.h"
#include "platform/process.h"

namespace {

using Origin = KvoPrefs::Origin;

constexpr const char* default_location = "/usr/quarn";
constexpr const char* first_project = "demo";
constexpr const char* default_workenv = ".";
constexpr const char* right_handed = "y_up";

/// What is asked at load, in the order of the lines that come back.
constexpr std::array<const char*, 5> asked_at_load = {
    "QUARN_WIRE_DIR", "QUARN_INPUT_PIX_DIR", "QUARN_MISC_DIR",
    "QUARN_DEFAULT_PROJECT", "QUARN_COORD_SYS"};
enum AskedAtLoad : std::size_t { Wire, Pix, Misc, DefaultProject, CoordSys };

// All of this is constant-initialised: the settings may be asked for while
// other static objects are still being made.
constinit bool loaded = false;
constinit bool may_ask = false; ///< Whether the query program may be run.
/// Our copy of QUARN_LOCATION as it was at load, which a host may put anything
/// in the place of; null if the search path is to be used.
constinit const char* installation = nullptr;
constinit Origin origins[4] = {Origin::NotAsked, Origin::NotAsked,
                               Origin::NotAsked, Origin::NotAsked};

Origin& origin_of(KvoPrefs::Setting setting)
{
    return origins[static_cast<int>(setting)];
}

const char* or_empty(const char* text)
{
    return text ? text : "";
}

bool is_absolute(const char* path)
{
    return *path == '/';
}

/// Replaces a text by a copy of another, which may be a part of it, and notes
/// where that is from. Without memory both stay.
void replace(char*& text, const char* by, Origin& origin, Origin found)
{
    char* const copy = ZtNewString(by);
    if (!copy)
        return;
    delete[] text;
    text = copy;
    origin = found;
}

/// Sets a text to the environment's, or else to the one that holds otherwise.
void take_setting(char*& text, KvoPrefs::Setting setting,
                  const char* environment, const char* otherwise)
{
    replace(text, environment ? environment : otherwise, origin_of(setting),
            environment ? Origin::Environment : Origin::Default);
}

KvoSkipList& table()
{
    // Never destroyed: the settings may be asked for to the very end.
    alignas(KvoSkipList) static unsigned char place[sizeof(KvoSkipList)];
    static KvoSkipList& list = *new (place) KvoSkipList;
    return list;
}

void ask(std::span<const char* const> names, std::span<zt_env::Answer> answers)
{
    if (may_ask)
        zt_env::QueryProgram(installation).ask(names, answers);
}

} // namespace

constinit char* KvoPrefs::location = nullptr;
constinit char* KvoPrefs::default_project = nullptr;
constinit char* KvoPrefs::project = nullptr;
constinit char* KvoPrefs::workenv = nullptr;
constinit int KvoPrefs::coord_sys = 0;

KvoPrefs::TableEntry::TableEntry(const char* variable_name,
                                 const char* default_text)
    : KvoNamedObject(variable_name), fallback(ZtNewString(default_text)),
      value(nullptr), origin(Origin::NotAsked)
{}

KvoPrefs::TableEntry::~TableEntry()
{
    delete[] fallback;
    delete[] value;
}

void KvoPrefs::TableEntry::SetValue(const char* text)
{
    keep(text, Origin::SetHere);
}

const char* KvoPrefs::TableEntry::Value()
{
    load_once();
    if (value)
        return value;
    zt_env::Answer answer;
    if (const char* set = std::getenv(name)) {
        keep(set, Origin::Environment);
    } else {
        if (zt_env::may_be_asked(name))
            ask(std::array<const char*, 1>{name}, {&answer, 1});
        keep(answer.get(), answer ? Origin::QueryProgram : Origin::Nowhere);
    }
    return or_empty(value);
}

const char* KvoPrefs::TableEntry::Default() const
{
    return or_empty(fallback);
}

void KvoPrefs::TableEntry::keep(const char* text, Origin found)
{
    replace(value, text, origin, found);
}

KvoPrefs::KvoPrefs()
{
    load_once();
}

void KvoPrefs::SetVariable(const char* name, const char* value)
{
    load_once();
    if (TableEntry* variable = entry(name, value))
        variable->SetValue(value);
}

const char* KvoPrefs::Variable(const char* name, const char* default_text)
{
    load_once();
    TableEntry* const variable = entry(name, default_text);
    return variable ? variable->Value() : "";
}

const KvoSkipList& KvoPrefs::Table()
{
    load_once();
    return table();
}

KvoPrefs::Origin KvoPrefs::OriginOf(Setting setting)
{
    load_once();
    return origin_of(setting);
}

void KvoPrefs::SetWorkEnv(const char* dir)
{
    load_once();
    replace(workenv, dir ? dir : default_workenv, origin_of(Setting::WorkEnv),
            dir ? Origin::SetHere : Origin::Default);
}

const char* KvoPrefs::WorkEnv()
{
    load_once();
    return or_empty(workenv);
}

void KvoPrefs::SetProject(const char* name)
{
    load_once();
    replace(project, name ? name : default_project, origin_of(Setting::Project),
            name ? Origin::SetHere : Origin::Default);
}

const char* KvoPrefs::Project()
{
    load_once();
    return or_empty(project);
}

const char* KvoPrefs::WireDir()
{
    return build_subdir(Variable("QUARN_WIRE_DIR", nullptr));
}

const char* KvoPrefs::PixDir()
{
    return build_subdir(Variable("QUARN_INPUT_PIX_DIR", nullptr));
}

const char* KvoPrefs::MiscDir()
{
    return build_subdir(Variable("QUARN_MISC_DIR", nullptr));
}

const char* KvoPrefs::StageDir()
{
    return build_subdir(Variable("QUARN_STAGE_DIR", nullptr));
}

const char* KvoPrefs::SLADir()
{
    return build_subdir(Variable("QUARN_SLA_DIR", nullptr));
}

const char* KvoPrefs::SDLDir()
{
    return build_subdir(Variable("QUARN_SDL_DIR", nullptr));
}

const char* KvoPrefs::AnimDir()
{
    return build_subdir(Variable("QUARN_ANIM_DIR", nullptr));
}

const char* KvoPrefs::ShaderDir()
{
    return build_subdir(Variable("QUARN_SHADER_DIR", nullptr));
}

const char* KvoPrefs::TextureDir()
{
    return build_subdir(Variable("QUARN_TEXTURE_DIR", nullptr));
}

const char* KvoPrefs::OptionDir()
{
    return build_subdir(Variable("QUARN_OPTION_DIR", nullptr));
}

const char* KvoPrefs::PlotDir()
{
    return build_subdir(Variable("QUARN_PLOT_DIR", nullptr));
}

const char* KvoPrefs::ProjectDir()
{
    return build_subdir(nullptr);
}

const char* KvoPrefs::HelpDir()
{
    load_once();
    return ZtFmt("%s/Help", or_empty(location));
}

const char* KvoPrefs::build_subdir(const char* sub)
{
    load_once();
    const char* const name = or_empty(project);
    const char* const work = or_empty(workenv);
    if (!sub)
        return is_absolute(name) ? ZtNewTempString(name)
                                 : ZtFmt("%s/user_data/%s", work, name);
    if (is_absolute(sub))
        return ZtNewTempString(sub);
    if (is_absolute(name))
        return ZtFmt("%s/%s", name, sub);
    return ZtFmt("%s/user_data/%s/%s", work, name, sub);
}

// Reads the settings, the first time only. Nothing in here may call an
// operation that others call.
void KvoPrefs::load_once()
{
    if (loaded)
        return;
    loaded = true;
    // Whoever starts a program that has more rights than he has must not
    // choose what it runs with them.
    may_ask = !zt_platform::Processes::current().has_raised_rights();
    const char* const set = may_ask ? std::getenv("QUARN_LOCATION") : nullptr;
    take_setting(location, Setting::Location, set, default_location);
    installation = set ? ZtNewString(set) : nullptr;
    may_ask = may_ask && (installation || !set);

    std::array<zt_env::Answer, asked_at_load.size()> answers;
    ask(asked_at_load, answers);
    const auto known = [&answers](AskedAtLoad asked, const char* fallback) {
        if (TableEntry* variable = entry(asked_at_load[asked], fallback))
            variable->keep(answers[asked].get(), answers[asked]
                                                     ? Origin::QueryProgram
                                                     : Origin::Nowhere);
    };
    known(Wire, "wire");
    known(Pix, "pix");
    known(Misc, "misc_data");
    known(CoordSys, right_handed);
    const char* const named = answers[DefaultProject].get();
    replace(default_project, named ? named : first_project,
            origin_of(Setting::DefaultProject),
            named ? Origin::QueryProgram : Origin::Default);
    const char* const axes = answers[CoordSys].get();
    coord_sys = axes && std::strcmp(axes, right_handed) != 0 ? 1 : 0;

    take_setting(project, Setting::Project, std::getenv("QUARN_PROJECT"),
                 default_project);
    take_setting(workenv, Setting::WorkEnv, std::getenv("QUARN_WORKENV"),
                 default_workenv);
}

// Finds or makes a variable; null when there is no memory for a new one.
KvoPrefs::TableEntry* KvoPrefs::entry(const char* name,
                                      const char* default_text)
{
    KvoSkipList& variables = table();
    if (KvoObject* known = variables.Search(or_empty(name)))
        return static_cast<TableEntry*>(known);
    auto* const made = new (std::nothrow) TableEntry(name, default_text);
    if (!made)
        return nullptr;
    const bool whole = std::strcmp(or_empty(made->name), or_empty(name)) == 0;
    if (whole && variables.InsertUnique(made))
        return made;
    delete made;
    return nullptr;
}

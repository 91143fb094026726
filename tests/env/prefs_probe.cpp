// Asks the preferences what its arguments say and prints the answers, one a
// line: what a host would find, from its start on.

#include <KVO/KvoPrefs.h>

#include <cstdlib>
#include <cstring>
#include <functional>
#include <iostream>
#include <map>
#include <string>
#include <sys/resource.h>

namespace {

/// The first call of all, before the objects of this file and of a static
/// library are made: what PROBE_SETS_FIRST says is set, then a question.
std::string first_call()
{
    const char* set = std::getenv("PROBE_SETS_FIRST");
    const std::string what = set ? set : "";
    if (what == "project")
        KvoPrefs::SetProject("early");
    else if (what == "workenv")
        KvoPrefs::SetWorkEnv("early");
    else if (what == "variable")
        KvoPrefs::SetVariable("QUARN_WIRE_DIR", "early");
    return KvoPrefs::WireDir();
}

const std::string early __attribute__((init_priority(101))) = first_call();

/// The arguments of the probe, taken one by one.
class Words
{
public:
    explicit Words(char** arguments) : at(arguments) {}

    bool Left() const { return *at != nullptr; }

    /// The next argument; null for "(null)".
    const char* Take()
    {
        const char* word = Left() ? *at++ : "";
        return std::strcmp(word, "(null)") == 0 ? nullptr : word;
    }

private:
    char** at;
};

using Answer = std::function<std::string(Words&)>;

std::string text_or_null(const char* text)
{
    return text ? text : "(null)";
}

std::string number(KvoPrefs::Origin origin)
{
    return std::to_string(static_cast<int>(origin));
}

/// Whether this process has waited for any child.
std::string children()
{
    rusage used = {};
    getrusage(RUSAGE_CHILDREN, &used);
    return used.ru_minflt == 0 ? "none" : "some";
}

std::string table()
{
    std::string all;
    for (KvoObject* object = KvoPrefs::Table().Head(); object;
         object = KvoPrefs::Table().Next()) {
        auto* variable = static_cast<KvoPrefs::TableEntry*>(object);
        all += std::string(all.empty() ? "" : " ") + variable->name + "=" +
               variable->Default() + ":" + number(variable->ValueOrigin());
    }
    return all;
}

std::string origins()
{
    using Setting = KvoPrefs::Setting;
    return number(KvoPrefs::OriginOf(Setting::Location)) +
           number(KvoPrefs::OriginOf(Setting::DefaultProject)) +
           number(KvoPrefs::OriginOf(Setting::Project)) +
           number(KvoPrefs::OriginOf(Setting::WorkEnv));
}

/// Answers for the questions that take no argument.
Answer plain(const char* (*question)())
{
    return [question](Words&) { return text_or_null(question()); };
}

Answer member(char*& text)
{
    return [&text](Words&) { return text_or_null(text); };
}

std::map<std::string, Answer> directories()
{
    return {
        {"wire", plain(KvoPrefs::WireDir)},
        {"pix", plain(KvoPrefs::PixDir)},
        {"misc", plain(KvoPrefs::MiscDir)},
        {"stage", plain(KvoPrefs::StageDir)},
        {"sla", plain(KvoPrefs::SLADir)},
        {"sdl", plain(KvoPrefs::SDLDir)},
        {"anim", plain(KvoPrefs::AnimDir)},
        {"shader", plain(KvoPrefs::ShaderDir)},
        {"texture", plain(KvoPrefs::TextureDir)},
        {"option", plain(KvoPrefs::OptionDir)},
        {"plot", plain(KvoPrefs::PlotDir)},
        {"project-dir", plain(KvoPrefs::ProjectDir)},
        {"help", plain(KvoPrefs::HelpDir)},
    };
}

std::map<std::string, Answer> questions()
{
    std::map<std::string, Answer> all = directories();
    all["workenv"] = plain(KvoPrefs::WorkEnv);
    all["project"] = plain(KvoPrefs::Project);
    all["location-member"] = member(KvoPrefs::location);
    all["default-project-member"] = member(KvoPrefs::default_project);
    all["project-member"] = member(KvoPrefs::project);
    all["workenv-member"] = member(KvoPrefs::workenv);
    all["early"] = [](Words&) { return early; };
    all["coord-sys"] = [](Words&) {
        return std::to_string(KvoPrefs::coord_sys);
    };
    all["children"] = [](Words&) { return children(); };
    all["table"] = [](Words&) { return table(); };
    all["origins"] = [](Words&) { return origins(); };
    all["subdir"] = [](Words& words) {
        return text_or_null(KvoPrefs::build_subdir(words.Take()));
    };
    all["variable"] = [](Words& words) {
        const char* name = words.Take();
        return text_or_null(KvoPrefs::Variable(name, words.Take()));
    };
    all["set"] = [](Words& words) {
        const char* name = words.Take();
        KvoPrefs::SetVariable(name, words.Take());
        return std::string("set");
    };
    all["set-project"] = [](Words& words) {
        KvoPrefs::SetProject(words.Take());
        return std::string("set");
    };
    all["set-workenv"] = [](Words& words) {
        KvoPrefs::SetWorkEnv(words.Take());
        return std::string("set");
    };
    all["construct"] = [](Words&) {
        const KvoPrefs another;
        return std::string("made");
    };
    all["overwrite"] = [](Words& words) {
        char* text = std::getenv(words.Take());
        std::memset(text, 'x', std::strlen(text));
        return std::string("overwritten");
    };
    all["setenv"] = [](Words& words) {
        const char* name = words.Take();
        setenv(name, words.Take(), 1);
        return std::string("set");
    };
    return all;
}

} // namespace

int main(int, char** argv)
{
    const std::map<std::string, Answer> known = questions();
    for (Words words(argv + 1); words.Left();) {
        const std::string question = words.Take();
        const auto found = known.find(question);
        if (found == known.end()) {
            std::cerr << "no question is called " << question << "\n";
            return 2;
        }
        std::cout << found->second(words) << "\n";
    }
    return 0;
}

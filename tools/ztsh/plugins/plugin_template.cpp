#include "plugins/plugin_template.h"

#include <algorithm>

namespace ztsh {

namespace {

// @NAME@ is the name, @KIND@ the kind.

constexpr char directive_source[] = R"(// The command word @NAME@.

#include <ZT/directive.h>
#include <ZT/plug.h>

#include <iostream>

namespace {

class @NAME@ : public ZtDirective
{
public:
    @NAME@() : ZtDirective("@NAME@") {}

    /// Carries out a statement whose first word is @NAME@. ArgText(0) is that
    /// word, ArgText(1) the first one behind it; past the end is null.
    void Act(KvoStatement* statement) override
    {
        const char* whom = statement->ArgText(1);
        std::cout << "@NAME@ says hello to " << (whom ? whom : "nobody")
                  << std::endl;
    }
};

} // namespace

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->OfferPlug("@NAME@", new @NAME@);
}
)";

constexpr char recognizer_source[] = R"(// The recognizer @NAME@.

#include <ZT/plug.h>
#include <ZT/recognizer.h>

namespace {

class @NAME@ : public KvoRecognizer
{
public:
    // What it looks for goes into `targets`, what it finds into `results`.
};

class @NAME@Factory : public KvoRecognizerFactory
{
public:
    KvoRecognizer* MakeRecognizer() override { return new @NAME@; }
};

} // namespace

ZT_PLUGIN(KvoRecognizerCatalog::plug_name, catalog)
{
    catalog->OfferPlug("@NAME@", new @NAME@Factory);
}
)";

constexpr char build[] = R"(cmake_minimum_required(VERSION 3.25)
project(@NAME@ CXX)

find_package(zt_util2 1.0 CONFIG REQUIRED)
include(CTest)

# Builds it, installs it beside the library's own plug-ins, and makes the test
# @NAME@_loads, which loads and unloads it.
zt_add_plugin(NAME @NAME@ KIND @KIND@ SOURCES @NAME@.cpp)
)";

constexpr char directive_test[] = R"(
zt_find_ztsh(ztsh)
if(BUILD_TESTING AND ztsh)
  add_test(NAME @NAME@_acts COMMAND ${ztsh} ${CMAKE_CURRENT_SOURCE_DIR}/test.zt
    WORKING_DIRECTORY $<TARGET_FILE_DIR:@NAME@>)
  set_tests_properties(@NAME@_acts PROPERTIES
    PASS_REGULAR_EXPRESSION "@NAME@ says hello to you"
    FAIL_REGULAR_EXPRESSION "Warning;Error")
endif()
)";

constexpr char directive_script[] =
    R"(# Run by the test @NAME@_acts where the plug-in was built.
LoadPlugins .
@NAME@ you
)";

bool is_letter(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

std::string filled(std::string text, const std::string& name,
                   const PluginKind& kind)
{
    const std::pair<std::string, std::string> marks[] = {{"@NAME@", name},
                                                         {"@KIND@", kind.name}};
    for (const auto& [mark, value] : marks)
        for (std::size_t at = text.find(mark); at != std::string::npos;
             at = text.find(mark, at + value.size()))
            text.replace(at, mark.size(), value);
    return text;
}

} // namespace

bool IsPluginName(const std::string& name)
{
    return !name.empty() && is_letter(name[0]) &&
           std::all_of(name.begin(), name.end(), [](char c) {
               return is_letter(c) || is_digit(c) || c == '_';
           });
}

std::vector<TemplateFile> TemplateFiles(const std::string& name,
                                        const PluginKind& kind)
{
    const bool directive = kind.name == std::string("directive");
    std::vector<TemplateFile> files = {
        {name + ".cpp", directive ? directive_source : recognizer_source},
        {"CMakeLists.txt", build}};
    if (directive) {
        files.back().text += directive_test;
        files.push_back({"test.zt", directive_script});
    }
    for (TemplateFile& file : files)
        file.text = filled(file.text, name, kind);
    return files;
}

} // namespace ztsh

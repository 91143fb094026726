#include "ZT/directive.h"
#include "ZT/error.h"
#include "ZT/plug.h"

namespace {
ZtDirective* directive_of(const ZtPlugCatalog::Plug& plug)
{
    return dynamic_cast<ZtDirective*>(plug.object);
}
} // namespace

ZtDirectiveCatalog::ZtDirectiveCatalog(ZtDispatcher& home_dispatcher)
    : ZtPlugCatalog(plug_name), dispatcher(home_dispatcher)
{}

ZtDirectiveCatalog::~ZtDirectiveCatalog()
{
    for (const char* name = HeadKey(); name; name = NextKey())
        dispatcher.Remove(directive_of(*FindPlug(name)));
}

void ZtDirectiveCatalog::InitializePlug(Plug* plug)
{
    if (ZtDirective* const directive = directive_of(*plug))
        dispatcher.Add(directive);
    else
        ZtWarning("Plug-in %s: %s is no directive\n",
                  plug->path ? plug->path : "of the program", plug->name);
}

const char* ZtDirectiveCatalog::Extension()
{
    return "d";
}

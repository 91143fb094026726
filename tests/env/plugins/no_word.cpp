#include "env/plugins/told.h"

ZT_PLUGIN(ZtDirectiveCatalog::plug_name, catalog)
{
    catalog->AddPlug("no_word", new ToldObject("no_word deleted"));
}

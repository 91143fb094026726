#include "env/plugins/told.h"

extern "C" ZT_API void KvoInitializePlugin(ZtPlugCatalog* catalog)
{
    catalog->AddPlug("no_id", nullptr);
}

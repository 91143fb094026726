#include "env/plugins/told.h"

ZT_PLUGIN(nullptr, catalog)
{
    catalog->AddPlug("id_null", nullptr);
}

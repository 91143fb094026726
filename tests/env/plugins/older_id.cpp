#include "env/plugins/told.h"

ZT_PLUGIN("Test:1.1", catalog)
{
    catalog->AddPlug("older_id", nullptr);
}

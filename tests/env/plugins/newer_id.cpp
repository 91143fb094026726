#include "env/plugins/told.h"

ZT_PLUGIN("Test:3.1", catalog)
{
    catalog->AddPlug("newer_id", nullptr);
}

#include "env/plugins/told.h"

ZT_PLUGIN("Test:2.0", catalog)
{
    catalog->AddPlug("wrong_id", nullptr);
}

#include "env/plugins/told.h"

ZT_PLUGIN("test:2.1", catalog)
{
    catalog->AddPlug("lower_case_id", nullptr);
}

#include "env/plugins/told.h"

extern int data_that_is_nowhere;

ZT_PLUGIN("Test:2.1", catalog)
{
    if (data_that_is_nowhere)
        catalog->AddPlug("missing_data", nullptr);
}

#include "env/plugins/told.h"

#include <string>

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug(std::string(70000, 'n').c_str(), nullptr);
}

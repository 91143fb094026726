#include "env/plugins/told.h"

extern "C" {
ZT_API const char* KvoPluginIDString = "Test:2.1";
}

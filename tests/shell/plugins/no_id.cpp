#include <ZT/plug.h>

extern "C" ZT_API void KvoInitializePlugin(ZtPlugCatalog*) {}

#include "platform/lazy_library.h"

#include "platform/dynlib.h"

namespace zt_platform {

void* LazyLibrary::address_of(const char* symbol)
{
    Dynlib& loader = Dynlib::current();
    if (!tried) {
        tried = true;
        handle = loader.open(name, Binding::Now);
    }
    return handle ? loader.symbol(handle, symbol) : nullptr;
}

} // namespace zt_platform

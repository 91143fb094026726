#include "platform/lazy_library.h"

#include <dlfcn.h>

namespace zt_platform {

void* LazyLibrary::address_of(const char* symbol)
{
    if (!tried) {
        tried = true;
        handle = ::dlopen(name, RTLD_NOW | RTLD_LOCAL);
    }
    return handle ? ::dlsym(handle, symbol) : nullptr;
}

} // namespace zt_platform

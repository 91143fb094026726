#include "env/plugins/told.h"

namespace {
ToldClosing closing("unique_symbol.so closed");
}

template <typename Type>
struct Shared
{
    ZT_API static inline Type value = 0;
};

// The loader keeps one `value` for the whole process, and with it this file.
ZT_PLUGIN("Test:2.1", catalog)
{
    Shared<int>::value += catalog ? 1 : 0;
}

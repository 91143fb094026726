#include "env/plugins/told.h"

#include <stdexcept>

namespace {
ToldClosing closing("entry_throws.so closed");

struct Refusal : std::runtime_error
{
    Refusal() : std::runtime_error("no licence") {}
    ~Refusal() override { TellTheTest("exception destroyed"); }
};
} // namespace

ZT_PLUGIN("Test:2.1", catalog)
{
    (void)catalog;
    throw Refusal();
}

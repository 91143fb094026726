#include "env/plugins/told.h"

void FunctionThatIsNowhere();

namespace {
class Caller : public KvoObject
{
public:
    void SetModified() override { FunctionThatIsNowhere(); }
};
} // namespace

ZT_PLUGIN("Test:2.1", catalog)
{
    catalog->AddPlug("missing_function", new Caller);
}

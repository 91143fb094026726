#include "KVO/KvoRecognizer.h"

namespace {
/// Has an operation where a factory's is, and is none.
class Impostor : public KvoObject
{
public:
    virtual KvoRecognizer* MakeRecognizer() { return nullptr; }
};
} // namespace

ZT_PLUGIN("Recognizer:2.1", catalog)
{
    catalog->AddPlug("impostor", new Impostor);
    catalog->AddPlug("nothing", nullptr);
}

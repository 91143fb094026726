#include "picture_recognizer.h"

#include <ZT/plug.h>

#include <limits>
#include <memory>

namespace {

/// Finds its first target four times, with scores that no score can be.
class Impossible : public PictureRecognizer
{
public:
    int Configure() override { return 1; }
    int Recognize(const ZtImageSGI&) override
    {
        constexpr double infinity = std::numeric_limits<double>::infinity();
        Reset();
        auto* target = static_cast<KvoRecognizerTarget*>(targets.Head());
        for (const double score : {-0.5, infinity - infinity, infinity, 1.25}) {
            auto result = std::make_unique<RecognizerResult>(*target);
            result->score = score;
            add_result(std::move(result));
        }
        return results.count;
    }
};

class ImpossibleFactory : public KvoRecognizerFactory
{
public:
    KvoRecognizer* MakeRecognizer() override { return new Impossible; }
};

} // namespace

ZT_PLUGIN("Recognizer:2.1", catalog)
{
    catalog->OfferPlug("Impossible", new ImpossibleFactory);
}

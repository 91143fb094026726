#include "edge/edge_recognizer.h"

#include "edge/search.h"

#include <ZT/error.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <new>
#include <utility>

namespace edge {

namespace {

constexpr int not_configured = -1;
constexpr int ready = 1;

KvoRecognizerTarget* target_of(const KvoList::Link* link)
{
    return static_cast<KvoRecognizerTarget*>(link->item);
}

bool has_contrast(const ZtImageSGI* picture)
{
    if (!picture)
        return false;
    const Grey grey = GreyOf(*picture);
    return std::adjacent_find(grey.values.begin(), grey.values.end(),
                              std::not_equal_to<>()) != grey.values.end();
}

} // namespace

int EdgeRecognizer::Configure()
{
    try {
        for (KvoList::Link* link = targets.head; link; link = link->next) {
            KvoRecognizerTarget* target = target_of(link);
            if (target->configured == not_configured &&
                has_contrast(target->picture))
                target->configured = ready;
        }
    } catch (const std::bad_alloc&) {
        ZtError("edge: no memory to look at the targets\n");
    }
    return Configured();
}

int EdgeRecognizer::Recognize(const ZtImageSGI& frame)
{
    Reset();
    try {
        search_all(frame);
    } catch (const std::bad_alloc&) {
        Reset();
        ZtError("edge: no memory for a frame of %d x %d pixels\n", frame.width,
                frame.height);
    }
    return results.count;
}

void EdgeRecognizer::search_all(const ZtImageSGI& frame)
{
    const Frame prepared(GreyOf(frame));
    for (KvoList::Link* link = targets.head; link; link = link->next) {
        KvoRecognizerTarget* target = target_of(link);
        if (target->configured == not_configured || !target->picture)
            continue;
        const Grey thumbnail = GreyOf(*target->picture);
        for (const Hit& hit : Search(prepared, thumbnail, threshold)) {
            auto result = std::make_unique<RecognizerResult>(*target);
            result->x = hit.x;
            result->y = hit.y;
            result->width = hit.width;
            result->height = hit.height;
            result->score = hit.score;
            if (!add_result(std::move(result)))
                throw std::bad_alloc();
        }
    }
}

} // namespace edge

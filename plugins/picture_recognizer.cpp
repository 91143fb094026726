#include "picture_recognizer.h"

KVO_DEFINE_CLASS_INFO(RecognizerResult, &KvoNamedObject::classInfo);

RecognizerResult::RecognizerResult(KvoRecognizerTarget& found)
    : KvoNamedObject(found.name), target(&found)
{}

RecognizerResult* RecognizerResult::From(void* result)
{
    return static_cast<RecognizerResult*>(
        classInfo.Cast(static_cast<KvoObject*>(result)));
}

KVO_DEFINE_CLASS_INFO(PictureRecognizer, &KvoObject::classInfo);

PictureRecognizer::PictureRecognizer() = default;

PictureRecognizer::~PictureRecognizer()
{
    PictureRecognizer::Reset();
}

PictureRecognizer* PictureRecognizer::From(KvoRecognizer* recognizer)
{
    return static_cast<PictureRecognizer*>(classInfo.Cast(recognizer));
}

void PictureRecognizer::Reset()
{
    for (KvoList::Link* link = results.head; link; link = link->next)
        delete static_cast<KvoObject*>(link->item);
    KvoRecognizer::Reset();
}

bool PictureRecognizer::add_result(std::unique_ptr<RecognizerResult> result)
{
    // The list takes addresses of KvoObject, and stays as it is if it cannot
    // grow.
    KvoObject* object = result.get();
    const int before = results.count;
    results.PushTail(object);
    if (results.count == before)
        return false;
    static_cast<void>(result.release());
    return true;
}

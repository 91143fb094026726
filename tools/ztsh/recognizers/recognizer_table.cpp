#include "recognizers/recognizer_table.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace ztsh {

HeldRecognizer::HeldRecognizer(std::unique_ptr<KvoRecognizer> fetched,
                               std::string plug_name)
    : plug(std::move(plug_name)), owner(std::move(fetched)),
      recognizer(PictureRecognizer::From(owner.get()))
{}

void HeldRecognizer::Add(std::unique_ptr<KvoRecognizerTarget> target)
{
    recognizer->Reset();
    if (KvoRecognizerTarget* former = recognizer->FindTarget(target->name)) {
        recognizer->targets.Remove(former);
        std::erase_if(targets, [former](const auto& kept) {
            return kept.get() == former;
        });
    }
    recognizer->targets.PushTail(target.get());
    targets.push_back(std::move(target));
}

std::unique_ptr<KvoRecognizer>
FetchPictureRecognizer(KvoRecognizerCatalog& catalog, const std::string& plug,
                       std::string& why)
{
    if (!catalog.FindPlug(plug.c_str())) {
        std::string known;
        for (const char* name = catalog.HeadKey(); name;
             name = catalog.NextKey())
            known += (known.empty() ? "are: " : ", ") + std::string(name);
        why = "no plug-in has brought it; there " +
              (known.empty() ? "are none" : known);
        return nullptr;
    }
    std::unique_ptr<KvoRecognizer> fetched(
        catalog.FetchRecognizer(plug.c_str()));
    if (!fetched)
        why = "its plug-in makes none";
    else if (!PictureRecognizer::From(fetched.get()))
        why = "it does not search pictures";
    else
        return fetched;
    return nullptr;
}

} // namespace ztsh

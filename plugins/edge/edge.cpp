/// \file
/// What the plug-in shows to the catalog that loads it.

#include "edge/edge_recognizer.h"

namespace {

class EdgeFactory : public KvoRecognizerFactory
{
public:
    KvoRecognizer* MakeRecognizer() override
    {
        return new edge::EdgeRecognizer;
    }
};

} // namespace

ZT_PLUGIN(KvoRecognizerCatalog::plug_name, catalog)
{
    constexpr const char* name = "edge";
    // A factory whose name is taken would stay ours.
    if (!catalog->FindPlug(name))
        KvoRecognizerFactory::AddPlugin(catalog, name, new EdgeFactory);
}

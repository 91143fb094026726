#include <ZT/plug.h>

ZT_PLUGIN("Recognizer:2.1", catalog)
{
    catalog->OfferPlug("Thing", new KvoObject);
}

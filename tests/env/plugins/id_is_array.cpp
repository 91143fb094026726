// No header of the library: it declares the id as what it ought to be.
class ZtPlugCatalog;
extern "C" __attribute__((visibility("default"))) void
TellTheTest(const char* what);

extern "C" {
__attribute__((visibility("default"))) char KvoPluginIDString[] = "Test:2.1";

__attribute__((visibility("default"))) void KvoInitializePlugin(ZtPlugCatalog*)
{
    TellTheTest("entered");
}
}

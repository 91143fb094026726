// No header of the library: it declares the id as what it ought to be.
extern "C" {
__attribute__((visibility("default"))) const char* KvoPluginIDString()
{
    return "Test:2.1";
}

__attribute__((visibility("default"))) void KvoInitializePlugin(void*) {}
}

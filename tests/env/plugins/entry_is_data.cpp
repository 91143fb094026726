// No header of the library: it declares the entry as what it ought to be.
extern "C" {
__attribute__((visibility("default"))) const char* KvoPluginIDString =
    "Test:2.1";
__attribute__((visibility("default"))) long KvoInitializePlugin = 0;
}

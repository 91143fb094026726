#include "platform/portaudio/pa_functions.h"

#include "platform/lazy_library.h"

namespace zt_platform {

namespace {

constinit LazyLibrary library("libportaudio.so.2");
constinit PaFunctions found = {};
constinit bool is_found = false;
constinit const PaFunctions* installed = nullptr;

template <class Function>
bool find(Function& function, const char* symbol)
{
    function = library.find<Function>(symbol);
    return function;
}

bool find_all()
{
    PaFunctions& f = found;
    return find(f.initialize, "Pa_Initialize") &&
           find(f.terminate, "Pa_Terminate") &&
           find(f.device_count, "Pa_GetDeviceCount") &&
           find(f.device_info, "Pa_GetDeviceInfo") &&
           find(f.default_input, "Pa_GetDefaultInputDevice") &&
           find(f.default_output, "Pa_GetDefaultOutputDevice") &&
           find(f.open_stream, "Pa_OpenStream") &&
           find(f.on_finished, "Pa_SetStreamFinishedCallback") &&
           find(f.start_stream, "Pa_StartStream") &&
           find(f.stop_stream, "Pa_StopStream") &&
           find(f.abort_stream, "Pa_AbortStream") &&
           find(f.close_stream, "Pa_CloseStream") &&
           find(f.stream_info, "Pa_GetStreamInfo");
}

} // namespace

const PaFunctions* PaFunctions::current()
{
    if (installed)
        return installed;
    if (!is_found)
        is_found = find_all();
    return is_found ? &found : nullptr;
}

void PaFunctions::install(const PaFunctions* other)
{
    installed = other;
}

} // namespace zt_platform

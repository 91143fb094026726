#ifndef ZT_PLATFORM_PORTAUDIO_PA_FUNCTIONS_H
#define ZT_PLATFORM_PORTAUDIO_PA_FUNCTIONS_H

/// \file
/// The functions of the PortAudio library that we call, found when first
/// needed.

#include <portaudio.h>

namespace zt_platform {

/// All of them; a test may put others in their place.
struct PaFunctions
{
    decltype(&Pa_Initialize) initialize;
    decltype(&Pa_Terminate) terminate;
    decltype(&Pa_GetDeviceCount) device_count;
    decltype(&Pa_GetDeviceInfo) device_info;
    decltype(&Pa_GetDefaultInputDevice) default_input;
    decltype(&Pa_GetDefaultOutputDevice) default_output;
    decltype(&Pa_OpenStream) open_stream;
    decltype(&Pa_SetStreamFinishedCallback) on_finished;
    decltype(&Pa_StartStream) start_stream;
    decltype(&Pa_StopStream) stop_stream;
    decltype(&Pa_AbortStream) abort_stream;
    decltype(&Pa_CloseStream) close_stream;
    decltype(&Pa_GetStreamInfo) stream_info;

    /// Gives the library's, or those that a test installed.
    ///
    /// Returns: null when the library or one of them is missing.
    static const PaFunctions* current();

    /// Installs others; null restores the library's.
    static void install(const PaFunctions* other);
};

} // namespace zt_platform

#endif

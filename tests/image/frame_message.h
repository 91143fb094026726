#ifndef ZT_TESTS_IMAGE_FRAME_MESSAGE_H
#define ZT_TESTS_IMAGE_FRAME_MESSAGE_H

#include <string>

#include "image/literal_frame.h"
#include "image/pictures.h"

/// Makes what goes to the frame store for a picture, spelled out.
inline std::string MessageOf(std::string host_name, int number,
                             const PixelList& pixels)
{
    host_name.resize(64, '\0');
    std::string message = host_name;
    for (int shift : {24, 16, 8, 0})
        message += static_cast<char>(static_cast<unsigned>(number) >> shift);
    return message + literal::VideoFrame(pixels);
}

#endif

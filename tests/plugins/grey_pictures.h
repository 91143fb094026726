#ifndef ZT_TESTS_PLUGINS_GREY_PICTURES_H
#define ZT_TESTS_PLUGINS_GREY_PICTURES_H

#include "edge/grey.h"

#include <cstdint>
#include <vector>

/// Grey pictures to compose frames of, the same ones in every run.

edge::Grey GreyPicture(int width, int height, std::vector<std::int32_t> values);

/// A picture of one grey.
edge::Grey Plain(int width, int height, int value);

/// Every pixel a random grey of its own.
edge::Grey Noise(int width, int height, unsigned seed);

/// Soft blobs of random place, size and grey, as large things in photographs.
edge::Grey Blobs(int width, int height, unsigned seed);

/// Scales to the nearest pixels.
edge::Grey Scaled(const edge::Grey& picture, int width, int height);

/// Puts `picture` into `frame` with its lower left corner at (x, y), as
/// value * gain + offset within 0 to 255; what lies outside is cut off.
void Paste(edge::Grey& frame, const edge::Grey& picture, int x, int y,
           double gain = 1.0, double offset = 0.0);

/// Adds a random number of -most to most to every pixel, within 0 to 255.
void AddNoise(edge::Grey& frame, int most, unsigned seed);

/// Makes a picture of these greys, in red, green and blue alike.
ZtImageSGI ImageOf(const edge::Grey& grey);

#endif

#ifndef ZT_TESTS_IMAGE_PICTURE_DIFFERENCE_H
#define ZT_TESTS_IMAGE_PICTURE_DIFFERENCE_H

#include <string>

/// Each reads a file of any bytes with the library, in both orders of
/// channels, with the plain and with the fastest lanes, and with the plain
/// reader of the tests.
///
/// Returns: the empty text, or where the two part.
std::string SgiDifferenceOn(const std::string& file);
std::string PixDifferenceOn(const std::string& file);
std::string YuvDifferenceOn(const std::string& file);

#endif

#ifndef ZTSH_PICTURES_PICTURE_FILES_H
#define ZTSH_PICTURES_PICTURE_FILES_H

/// \file
/// Loading and storing with an answer: the library itself reports neither.

#include "pictures/picture_table.h"

#include <memory>
#include <string>

namespace ztsh {

/// The kinds of picture files, by the library's numbers.
enum PictureKind : int { Sgi = 0, Yuv = 1, Pix = 2, Auto = 3 };

/// Finds the kind that `word` names: sgi, yuv, pix or auto.
///
/// Returns: false if it names none.
bool KindOf(const std::string& word, PictureKind& kind);

/// Loads a picture. Never waits: what is no ordinary file is refused.
///
/// Returns: the picture; null with `why` set.
std::shared_ptr<Picture> LoadPicture(const std::string& name, PictureKind kind,
                                     std::string& why);

/// Stores a picture as an SGI image file and reads it back to be sure. An
/// older file is replaced only when the new one is found to be right.
///
/// Returns: the empty text, or why there is no such file now.
std::string StorePicture(const ZtImageSGI& image, const std::string& name);

/// Has a stored row that is longer than its bound fail the load, where the
/// library would end the process.
void SurviveOverlongRows();

} // namespace ztsh

#endif

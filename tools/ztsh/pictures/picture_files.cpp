#include "pictures/picture_files.h"

#include "system/files.h"

#include <ZT/filepath.h>

#include <algorithm>

namespace ztsh {

namespace {

constexpr const char* kind_words[] = {"sgi", "yuv", "pix", "auto"};

bool overlong_row_seen = false;

void note_overlong_row()
{
    overlong_row_seen = true;
}

/// The kind that the library chooses by a name's extension.
PictureKind kind_by_name(const std::string& name)
{
    std::string extension = ZtFilePath(name.c_str()).Extension();
    if (extension == "sgi" || extension == "rgb")
        return Sgi;
    return extension == "yuv" || extension == "qtl" ? Yuv : Pix;
}

/// Says what was expected of a file that the library did not load.
std::string why_not_loaded(PictureKind kind, bool chosen_by_name)
{
    if (kind == Sgi && overlong_row_seen)
        return "a row is stored in more bytes than such a row can take";
    if (kind == Sgi)
        return "expected an SGI picture of one byte a channel and at most 4 "
               "channels";
    std::string why = "expected a pix picture of 24 bits a pixel";
    if (chosen_by_name)
        why += "; by its name, since only .sgi and .rgb are taken for SGI "
               "pictures, .yuv and .qtl for video frames";
    return why;
}

/// Tells whether two pictures have the same size and colours; alpha is not
/// stored.
bool same_colours(const ZtImageSGI& one, const ZtImageSGI& other)
{
    if (one.width != other.width || one.height != other.height || !other.pixels)
        return false;
    std::size_t pixels = static_cast<std::size_t>(one.width) *
                         static_cast<std::size_t>(one.height);
    constexpr int alpha_bits = 8;
    return std::equal(one.pixels, one.pixels + pixels, other.pixels,
                      [](ZtPixel a, ZtPixel b) {
                          return (a >> alpha_bits) == (b >> alpha_bits);
                      });
}

} // namespace

bool KindOf(const std::string& word, PictureKind& kind)
{
    for (int i = Sgi; i <= Auto; ++i) {
        if (word == kind_words[i]) {
            kind = static_cast<PictureKind>(i);
            return true;
        }
    }
    return false;
}

std::shared_ptr<Picture> LoadPicture(const std::string& name, PictureKind kind,
                                     std::string& why)
{
    why = WhyNotReadable(name);
    if (!why.empty())
        return nullptr;
    PictureKind meant = kind == Auto ? kind_by_name(name) : kind;
    overlong_row_seen = false;
    // Loaded in place: copying would touch all the memory of a picture whose
    // file holds little but a header.
    std::shared_ptr<Picture> picture(
        new Picture{ZtImageSGI(name.c_str(), meant),
                    name + " (" + kind_words[meant] + ")"});
    if (picture->image.pixels)
        return picture;
    why = why_not_loaded(meant, kind == Auto);
    return nullptr;
}

std::string StorePicture(const ZtImageSGI& image, const std::string& name)
{
    constexpr int most = 65535;
    if (!image.pixels || image.width < 1 || image.height < 1)
        return "the picture has no pixels";
    if (image.width > most || image.height > most)
        return "a stored picture is at most 65535 pixels wide and high";
    std::string why = WhyNotWritable(name);
    if (!why.empty())
        return why;

    FileInMaking making(name);
    ZtImageSGI stored(image);
    stored.Store(making.Name().c_str());
    ZtImageSGI back(making.Name().c_str(), Sgi);
    if (!same_colours(image, back))
        return "the file could not be written whole; is there room for it?";
    return making.PutInPlace();
}

void SurviveOverlongRows()
{
    ZtSetOverlongRowHandler(note_overlong_row);
}

} // namespace ztsh

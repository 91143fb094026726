#ifndef ZT_IMAGE_SGI_H
#define ZT_IMAGE_SGI_H

/// \file
/// Pictures: the SGI image file codec, the raw 4:2:2 video frame, the maker's
/// pix format, and the image object that loads, scales and stores them.
///
/// A pixel is a 32-bit number, never four bytes in memory, and there are two
/// orders of its channels. The codec functions work in codec order,
/// 0xAABBGGRR; `ZtImageSGI` holds object order, 0xRRGGBBAA, the same bytes
/// reversed. Rows always stand bottom row first. Nothing here may run inside
/// the beat or a signal, and callers zoom from one thread at a time.
///
/// Readers refuse pictures of more than 2^28 pixels; the environment variable
/// ZT_MAX_PIXELS sets another limit, in pixels.

#include <KVO/KvoCommon.h>

#include <cstdint>

/// One pixel: 0xAABBGGRR in codec order, 0xRRGGBBAA in object order.
using ZtPixel = std::uint32_t;

/// Reads the size of an SGI image file.
///
/// Bytes that a short file does not hold count as zeros. Only the magic number
/// is examined: a size may be given for a file that `longimagedata` refuses.
///
/// Units:     `xsize` and `ysize` in pixels; untouched on failure.
/// Returns:   1, or 0 when the file cannot be opened or is no SGI image.
/// By design: a file with a wrong magic number stays open; the next file that
///            is refused closes it (sgi_header.ARefusedFileStaysOpen).
ZT_API int sizeofimage(const char* name, int& xsize, int& ysize);

/// Does the same through pointers.
inline int sizeofimage(const char* name, int* xsize, int* ysize)
{
    return sizeofimage(name, *xsize, *ysize);
}

/// Reads an SGI image file, run-length or verbatim, of one byte a channel and
/// at most four channels.
///
/// Grey files become opaque grey, a second channel is dropped, three channels
/// get alpha 255, no channel at all is opaque black. What the file ought to
/// hold and does not reads as zero. Behind the pixels lie five words more:
/// 0x12345678, 0x59493333, 0x69434222, width, height.
///
/// Owner:     the caller, who releases the pixels with `free`.
/// Returns:   the pixels in codec order; null for a file that cannot be
///            opened, is no SGI image, has other than one byte or more than
///            four channels, holds too many pixels, or for lack of memory.
/// By design: a file whose rows are stored out of order ends the process with
///            status 1, silently, when a row's stored length is over
///            1.05 * width + 10; see `ZtSetOverlongRowHandler`. A file in good
///            order is not tested (sgi_reader.OnlyRowsOutOfOrderHaveABound).
/// By design: a file with a wrong magic number or sample size stays open, as
///            with `sizeofimage`.
ZT_API ZtPixel* longimagedata(const char* name);

/// Writes an SGI image file, run-length coded, of `zsize` channels.
///
/// With one channel the luminance is written, not red.
///
/// Requires: xsize * ysize pixels in codec order.
/// Units:    `xsize` and `ysize` 1..65535, `zsize` 1..4.
/// Returns:  1 when every byte reached the file and it closed well, else 0;
///           the file then holds what could be written.
ZT_API int longstoimage(const ZtPixel* pixels, int xsize, int ysize, int zsize,
                        const char* name);

/// Scales a picture of ax by ay pixels to one of bx by by pixels, taking the
/// nearest pixel for each; works in either order of channels.
///
/// Does nothing when a size is below 1.
///
/// Requires: room for bx * by pixels at `destination`, apart from the source.
ZT_API void fastzoom(const ZtPixel* source, ZtPixel* destination, int ax,
                     int ay, int bx, int by);

/// Reads a raw 4:2:2 video frame of 720 x 486 pixels, whatever the file's
/// size; bytes that it does not hold count as zeros.
///
/// Owner:   the caller, who releases the pixels with `free`.
/// Returns: the pixels in codec order with alpha 0; null for lack of memory.
/// Reports: prints "Couldn't open yuv file [NAME]" on standard error; the
///          picture is then all zeros.
ZT_API ZtPixel* longimageyuvdata(const char* name);

/// Converts one sample of video to red, green and blue.
///
/// Units: `luma` less its offset of 16, the chromas less 128; the results in
///        16.16 fixed point, 0 or 0x10000..0xFFFFFF.
ZT_API void decode_yuv(int& red, int& green, int& blue, int luma, int chroma1,
                       int chroma2);

/// Does the same through pointers.
inline void decode_yuv(int* red, int* green, int* blue, int luma, int chroma1,
                       int chroma2)
{
    decode_yuv(*red, *green, *blue, luma, chroma1, chroma2);
}

/// What is called for a compressed row that is longer than its bound.
using ZtOverlongRowHandler = void (*)();

/// Replaces what happens for a compressed row that is longer than its bound;
/// at first that is `exit(1)`.
///
/// A handler may return: the reading or writing then fails as for a file that
/// cannot be opened. Null restores `exit(1)`.
///
/// Returns: the handler that was installed before, null for `exit(1)`.
ZT_API ZtOverlongRowHandler
ZtSetOverlongRowHandler(ZtOverlongRowHandler handler);

/// The header of a pix file, its fields in the file's order.
struct QuarnHeader
{
    std::uint16_t width;          ///< Pixels a row, 1..8192.
    std::uint16_t height;         ///< Rows, 1..8192.
    std::uint16_t x_offset;       ///< Not used.
    std::uint16_t y_offset;       ///< Not used.
    std::uint16_t bits_per_pixel; ///< Always 24.
};

/// Reads a pix file.
///
/// Pixels that the file does not reach are zero.
///
/// Owner:     the caller, who releases the pixels with `free`.
/// Returns:   the pixels in codec order; null when the file cannot be opened,
///            its header is short or out of range (`header` then holds what
///            was read), a packet is cut, the picture is too large, or for
///            lack of memory.
/// By design: a run is not split at the end of a row: it goes on into the row
///            above, and the next packet starts the row below
///            (quarnimg.ARunGoesOnOverTheEndOfItsRow).
ZT_API ZtPixel* ReadQuarnPix(const char* name, QuarnHeader& header);

/// A true-colour picture in memory: a size and one word a pixel.
///
/// A picture that failed to load is empty: no size and no pixels.
class ZT_API ZtImageSGI
{
public:
    /// Takes `image_pixels` as its own; null is replaced by zeroed pixels.
    ///
    /// Requires: a buffer from `malloc` of image_width * image_height pixels
    ///           in object order, or null.
    /// Owner:    this object, until it is destroyed or resized.
    /// Reports:  nothing; without memory, or for a size below 0 and no buffer,
    ///           the picture is empty.
    ZtImageSGI(int image_width, int image_height, ZtPixel* image_pixels);

    /// Loads a file.
    ///
    /// `type` is 0 for an SGI image, 1 for a raw video frame, 2 for a pix
    /// file, 3 to choose by the name's extension: "sgi" and "rgb" are SGI
    /// images, "yuv" and "qtl" video frames, everything else, also in upper
    /// case, pix files. Any other type gives an empty picture.
    ///
    /// Reports: what the readers report; a failure leaves an empty picture,
    ///          except that a video frame that cannot be opened is all zeros.
    ZtImageSGI(const char* name, int type);

    /// Copies the picture with its pixels; without memory the copy is empty.
    ZtImageSGI(const ZtImageSGI& other);

    /// Copies the picture with its pixels; without memory nothing changes.
    ZtImageSGI& operator=(const ZtImageSGI& other);

    ~ZtImageSGI();

    /// Writes the picture as a run-length SGI image file of three channels;
    /// alpha is not stored.
    ///
    /// Reports: nothing, not even a failure.
    void Store(const char* name);

    /// Scales the picture to the nearest pixels; all four channels survive.
    ///
    /// Units:   a size below 1 counts as 1.
    /// Owner:   the old pixels are released; pointers into them are dead.
    /// Reports: nothing; an empty picture, or one for whose scaling there is
    ///          no memory, stays as it is.
    void Resize(int new_width, int new_height);

    /// Scales the picture by averaging areas, first across, then down.
    ///
    /// Units:     a size below 1 counts as 1.
    /// Owner:     the old pixels are released; pointers into them are dead.
    /// Reports:   nothing; without memory the picture stays as it is.
    /// By design: only green, blue and alpha are averaged and red becomes 0
    ///            (image_sgi.ResizeBestClearsRed); an average may come out one
    ///            lower than exact, also between equal pixels.
    /// By design: an empty picture becomes a black one of the new size
    ///            (image_sgi.ResizeBestOfAnEmptyPictureMakesABlackOne).
    void ResizeBest(int new_width, int new_height);

    /// Sends the picture to the frame store, as video frame `frame` of 720 x
    /// 486 in 4:2:2, its two fields one after the other. A picture of any
    /// other size than 648 x 486 is not sent.
    ///
    /// The frame store is a server on port 5333 of the host that the variable
    /// QUARN_DDR_HOST names, in the environment or the installation. As long
    /// as the lock file /ddr/ddr_lock exists the call waits, five seconds at a
    /// time.
    ///
    /// Requires:  800 KiB of stack: nothing is allocated.
    /// Units:     `frame` counts as the recorder does; any number is sent.
    /// Reports:   prints lines on standard error: one at the start, one for
    ///            each wait, one for a failure, none for success. Nothing else
    ///            tells how it went.
    /// Context:   must not run inside the beat, which may run meanwhile.
    /// By design: neither the lock file nor a server that does not answer is
    ///            ever given up (frame_store_server.ASlowAnswerIsWaitedFor).
    /// By design: only the answer "BAD" is a refusal; any other four bytes are
    ///            success (frame_store_server.AnyOtherFourBytesAreSuccess).
    void ToDDR(int frame);

    int width;       ///< Pixels a row.
    int height;      ///< Rows.
    ZtPixel* pixels; ///< Object order, bottom row first; null when empty.
};

#endif

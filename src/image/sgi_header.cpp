#include "image/sgi_header.h"

#include "platform/byte_order.h"

#include <ZT/image_sgi.h>

#include <cstdlib>
#include <cstring>

namespace zt_image {

namespace {

using zt_platform::load_big_16;
using zt_platform::store_big_16;
using zt_platform::store_big_32;

constinit int held_refused_file = -1;
constinit ZtOverlongRowHandler overlong_row_handler = nullptr;

} // namespace

SgiHeader read_sgi_header(const zt_platform::InputFile& file)
{
    unsigned char bytes[12] = {};
    file.read_at(0, bytes, sizeof bytes);
    return {load_big_16(bytes),     load_big_16(bytes + 2),
            load_big_16(bytes + 4), load_big_16(bytes + 6),
            load_big_16(bytes + 8), load_big_16(bytes + 10)};
}

void store_sgi_header(unsigned char* bytes, int xsize, int ysize, int zsize)
{
    std::memset(bytes, 0, sgi_header_bytes);
    store_big_16(bytes, sgi_magic);
    store_big_16(bytes + 2, 0x0101);
    store_big_16(bytes + 4, zsize < 2 ? 2 : 3);
    store_big_16(bytes + 6, static_cast<std::uint16_t>(xsize));
    store_big_16(bytes + 8, static_cast<std::uint16_t>(ysize));
    store_big_16(bytes + 10, static_cast<std::uint16_t>(zsize));
    store_big_32(bytes + 16, 255); // The largest value of a channel.
    std::memcpy(bytes + 24, "no name", sizeof "no name");
}

void hold_refused(zt_platform::InputFile& file)
{
    if (held_refused_file >= 0)
        zt_platform::Files::current().close(held_refused_file);
    held_refused_file = file.release();
}

void overlong_row()
{
    if (!overlong_row_handler)
        std::exit(1);
    overlong_row_handler();
}

} // namespace zt_image

int sizeofimage(const char* name, int& xsize, int& ysize)
{
    zt_platform::InputFile file(name);
    if (!file.is_open())
        return 0;
    zt_image::SgiHeader header = zt_image::read_sgi_header(file);
    if (header.imagic != zt_image::sgi_magic) {
        zt_image::hold_refused(file);
        return 0;
    }
    xsize = header.xsize;
    ysize = header.ysize;
    return 1;
}

ZtOverlongRowHandler ZtSetOverlongRowHandler(ZtOverlongRowHandler handler)
{
    ZtOverlongRowHandler before = zt_image::overlong_row_handler;
    zt_image::overlong_row_handler = handler;
    return before;
}

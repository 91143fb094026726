#include "core/number_text.h"

#include <charconv>

#include "platform/number.h"

int zt_core::text_to_int(const char* text)
{
    return text ? static_cast<int>(zt_platform::parse_long(text)) : 0;
}

double zt_core::text_to_float(const char* text)
{
    return text ? zt_platform::parse_double(text) : 0.0;
}

std::string zt_core::int_to_text(int value)
{
    char text[16];
    const auto end = std::to_chars(text, text + sizeof text, value).ptr;
    return {text, end};
}

std::string zt_core::float_to_text(double value)
{
    char text[32];
    const auto end = std::to_chars(text, text + sizeof text, value,
                                   std::chars_format::general, 6)
                         .ptr;
    return {text, end};
}

#ifndef ZT_ENV_PLUG_ID_H
#define ZT_ENV_PLUG_ID_H

/// \file
/// Identification strings of plug-ins taken apart: "Recognizer:2.1".

#include <string_view>

namespace zt_env {
struct PlugId
{
    std::string_view name; ///< Part of the text that was taken apart.
    int first;
    int second;
};

/// Takes `text` apart; null is the empty text. Numbers that are missing, or
/// are none, are 0; too large ones are the ends of the range of int.
PlugId split_id(const char* text);
} // namespace zt_env

#endif

#ifndef ZT_ENV_PLUG_CANDIDATE_H
#define ZT_ENV_PLUG_CANDIDATE_H

/// \file
/// A file on its way into a catalog of plug-ins.

#include "ZT/plug.h"

struct ZtPlugCatalog::Candidate
{
    const char* file;
    void* handle = nullptr;        ///< What the loader gave, or null.
    const char* plug_id = nullptr; ///< In the plug-in; null if unknown.
    const char* taken = nullptr;   ///< The first name that was there already.
    const char* verdict = nullptr; ///< For people who trace the loading.
    Candidate* outer = nullptr;    ///< The one whose entry scans this one.
};

#endif

#ifndef ZT_TIME_CALLBACK_STORE_H
#define ZT_TIME_CALLBACK_STORE_H

/// \file
/// Where callback records come from: pages of the system's, cut into places
/// that are used again and never given back, so that the beat may take and free
/// records.

#include "ZT/timer.h"

namespace zt_time {

/// Gives room for a record; null when the system has none.
void* take_callback_place();

/// Takes the room of a record back. Inside the beat it is not used again, and
/// keeps what stands in it, until the beat ends: a walk may stand on it.
void give_callback_place_back(void* place);

/// Makes the room that was freed inside the beat available.
///
/// Context: while the beat is held back, and no walk is under way.
void reuse_freed_callback_places();

/// Puts a record at the end of a list, unless it stands there already. Null is
/// no record.
void append_callback(ZtTimerCallbackInfo*& list, ZtTimerCallbackInfo* record);

/// Frees one record, whose callback is not called any more.
void free_callback(ZtTimerCallbackInfo* record);

/// Frees a list of records, and makes it empty.
void free_callbacks(ZtTimerCallbackInfo*& list);

} // namespace zt_time

#endif

#include "platform/new_file.h"

#include "platform/files.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace zt_platform {

namespace {

constexpr const char* name_begins = ".zt_new_";
constexpr std::size_t longest_name = 24;

/// So many files of other processes, or left by some that died, may stand in
/// the way.
constexpr unsigned most_tries = 1000;

} // namespace

NewFile::NewFile(const char* path)
    : place(nullptr), temporary(nullptr), handle(-1), sound(true)
{
    if (!path)
        return;
    Files& files = Files::current();
    switch (files.kind(path)) {
    case FileKind::Nothing:
        place = ::strdup(path);
        open_beside();
        break;
    case FileKind::Regular:
        if (files.accessible(path, Access::Write)) {
            place = files.resolve(path);
            open_beside();
        }
        break;
    case FileKind::Other:
        handle = files.open_output(path);
        break;
    }
}

NewFile::~NewFile()
{
    sound = false;
    finish();
    std::free(place);
    std::free(temporary);
}

bool NewFile::append(const void* from, std::size_t bytes)
{
    sound = sound && is_open();
    std::size_t done = 0;
    while (sound && done < bytes) {
        std::ptrdiff_t went = Files::current().write_next(
            handle, static_cast<const char*>(from) + done, bytes - done);
        if (went > 0)
            done += static_cast<std::size_t>(went);
        else if (went == 0 || errno != EINTR)
            sound = false;
    }
    return sound;
}

bool NewFile::rewrite_beginning(const void* from, std::size_t bytes)
{
    sound = sound && is_open();
    std::size_t done = place ? 0 : bytes;
    while (sound && done < bytes) {
        const std::ptrdiff_t went = Files::current().write_at(
            handle, static_cast<const char*>(from) + done, bytes - done, done);
        if (went > 0)
            done += static_cast<std::size_t>(went);
        else if (went == 0 || errno != EINTR)
            sound = false;
    }
    return sound;
}

bool NewFile::finish()
{
    if (handle < 0)
        return false;
    Files& files = Files::current();
    sound = files.close(handle) && sound;
    handle = -1;
    if (!place)
        return sound;
    sound = sound && files.move(temporary, place);
    if (!sound)
        files.remove(temporary);
    return sound;
}

void NewFile::open_beside()
{
    if (!place)
        return;
    const char* slash = std::strrchr(place, '/');
    std::size_t folder =
        slash ? static_cast<std::size_t>(slash + 1 - place) : 0;
    temporary = static_cast<char*>(std::malloc(folder + longest_name));
    if (!temporary || place[folder] == '\0')
        return;
    std::memcpy(temporary, place, folder);
    for (unsigned number = 0; handle < 0 && number < most_tries; ++number) {
        std::snprintf(temporary + folder, longest_name, "%s%u", name_begins,
                      number);
        handle = Files::current().open_new(temporary, place);
        if (handle < 0 && errno != EEXIST)
            break;
    }
}

} // namespace zt_platform

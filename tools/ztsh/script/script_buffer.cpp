#include "script/script_buffer.h"

#include "system/signals.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <sys/stat.h>
#include <unistd.h>

namespace ztsh {

namespace {

constexpr std::size_t most_bytes = 65536;

/// A small script gets a small block, since scripts nest.
std::size_t block_bytes(int descriptor)
{
    struct stat status = {};
    if (fstat(descriptor, &status) != 0 || !S_ISREG(status.st_mode))
        return most_bytes;
    auto size = static_cast<std::size_t>(std::max<off_t>(status.st_size, 0));
    return std::clamp<std::size_t>(size + 1, 64, most_bytes);
}

} // namespace

ScriptBuffer::ScriptBuffer(int script_descriptor, Idle* waiting_idle)
    : descriptor(script_descriptor), idle(waiting_idle),
      block(1 + block_bytes(script_descriptor)), mark(nullptr), mark_line(1),
      lines_before(0), counted_to(nullptr), counted(0)
{
    show_block(0);
}

ScriptBuffer::ScriptBuffer(const std::string& text)
    : descriptor(-1), idle(nullptr), block(1 + text.size()), mark(nullptr),
      mark_line(1), lines_before(0), counted_to(nullptr), counted(0)
{
    std::memcpy(block.data() + 1, text.data(), text.size());
    show_block(text.size());
}

void ScriptBuffer::Mark()
{
    mark = gptr();
}

long ScriptBuffer::MarkedLine()
{
    return mark ? line_of(mark) : mark_line;
}

ScriptBuffer::int_type ScriptBuffer::underflow()
{
    if (gptr() < egptr())
        return traits_type::to_int_type(*gptr());
    if (descriptor < 0)
        return traits_type::eof();
    // At the end of the block a mark there belongs to the block to come.
    if (mark && mark < egptr()) {
        mark_line = line_of(mark);
        mark = nullptr;
    }
    bool marks_next = mark != nullptr;
    long lines = line_of(egptr()) - 1;
    char last = egptr() > eback() ? egptr()[-1] : '\0';

    std::size_t bytes = read_more();
    if (bytes == 0) {
        // The end is final; a terminal would give more if it were asked again.
        descriptor = -1;
        return traits_type::eof();
    }
    lines_before = lines;
    block[0] = last;
    show_block(bytes);
    if (marks_next)
        mark = gptr();
    return traits_type::to_int_type(*gptr());
}

void ScriptBuffer::show_block(std::size_t bytes)
{
    char* start = block.data() + 1;
    setg(block.data(), start, start + bytes);
    counted_to = start;
    counted = 0;
}

long ScriptBuffer::line_of(const char* place)
{
    const char* start = block.data() + 1;
    if (place < counted_to) {
        counted_to = start;
        counted = 0;
    }
    counted += std::count(counted_to, place, '\n');
    counted_to = place;
    return 1 + lines_before + counted;
}

std::size_t ScriptBuffer::read_more()
{
    for (;;) {
        if (idle && WaitFor({.descriptor = descriptor}, *idle) == Waited::Over)
            return 0;
        if (StopSignal() != 0)
            return 0;
        ssize_t got = read(descriptor, block.data() + 1, block.size() - 1);
        if (got >= 0)
            return static_cast<std::size_t>(got);
        if (errno != EINTR)
            return 0;
    }
}

} // namespace ztsh

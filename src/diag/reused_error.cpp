#include "diag/reused_error.h"

#include <atomic>
#include <new>
#include <streambuf>
#include <string>
#include <utility>

#include "ZT/error.h"
#include "core/slab.h"
#include "core/stream_state.h"

namespace zt_diag {
namespace {

// A stream keeps no more than this for its next text.
constexpr std::size_t most_bytes_kept = 4096;

/// An error that comes back when it is deleted.
class ReusedErr final : public ZtErr
{
public:
    ReusedErr() : ZtErr(nullptr, 0, 0), fresh(stream) { --count; }

    /// Tells whether one that is made now would have the same stream.
    bool is_as_good_as_new() const { return fresh.is_of_this_locale(); }

    /// Makes the error out of this one, which has neither text nor number yet.
    ///
    /// Returns: false without the memory for the text.
    bool begin(int error_code, int error_level, int last_failure,
               std::initializer_list<std::string_view> pieces);

    static void operator delete(ReusedErr* error, std::destroying_delete_t);

private:
    bool put_away();

    const zt_core::StreamState fresh;
};

// The one that waits, or null. It belongs to whoever takes it out, so neither
// a handler that reports in its turn nor a signal can get it a second time.
constinit std::atomic<ReusedErr*> waiting = nullptr;

void free_now(ReusedErr* error)
{
    error->~ReusedErr();
    ::operator delete(error);
}

// Writes past the stream, whose settings are those of a new one.
bool write(std::streambuf& buffer, std::string_view text)
{
    const auto length = static_cast<std::streamsize>(text.size());
    try {
        return buffer.sputn(text.data(), length) == length;
    } catch (...) {
        return false;
    }
}

bool ReusedErr::begin(int error_code, int error_level, int last_failure,
                      std::initializer_list<std::string_view> pieces)
{
    code = error_code;
    level = error_level;
    system_error = last_failure;
    ++count;
    for (const std::string_view piece : pieces)
        if (!write(*stream.rdbuf(), piece))
            return false;
    return true;
}

bool ReusedErr::put_away()
{
    if (zt_core::pieces_are_separate || message == no_text ||
        !fresh.is_that_of(stream, most_bytes_kept))
        return false;
    delete[] std::exchange(message, nullptr);
    stream.str(std::string());
    return true;
}

void ReusedErr::operator delete(ReusedErr* error, std::destroying_delete_t)
{
    if (error->put_away())
        error = waiting.exchange(error);
    if (error)
        free_now(error);
}

} // namespace

ZtErr* make_error(int code, int level, int system_error,
                  std::initializer_list<std::string_view> pieces)
{
    ReusedErr* error = waiting.exchange(nullptr);
    if (error && !error->is_as_good_as_new())
        free_now(std::exchange(error, nullptr));
    if (!error)
        error = new (std::nothrow) ReusedErr;
    if (error && error->begin(code, level, system_error, pieces))
        return error;
    if (error)
        free_now(error);
    return nullptr;
}

} // namespace zt_diag

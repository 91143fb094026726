#include "ZT/error.h"

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <iostream>
#include <new>
#include <string_view>

#include "core/format_text.h"
#include "core/write_text.h"
#include "diag/reused_error.h"
#include "diag/signal_report.h"
#include "platform/signal_handler.h"

// All of it is ready before any code runs: reports are made before `main` too.
constinit int ZtErr::count = 0;
constinit ZtErrHandler* ZtErrHandler::handlerStack = nullptr;
constinit int ZtErrHandler::outputLevel = 3;
constinit int ZtErrHandler::abortLevel = 5;
constinit std::ostream* ZtErrHandler::output = &std::cerr;

namespace {
constexpr int debug = 1, information = 2, warning = 3, error = 4;

enum Kind : int {
    Message = 0,
    BadValue = 1,
    BadPointer = 2,
    StreamFailure = 3,
    SystemFailure = 4,
    Status = 5
};

// The handler that the first report makes, or null. It has no code but the
// base's own, so what it does with an error is known beforehand.
constinit ZtErrHandler* default_handler = nullptr;

// Room for it, kept ready in case the first report is made in a signal.
constinit void* default_handler_room = nullptr;

// Not 0 while a queue is being changed, which a signal must leave alone then.
constinit volatile int queues_in_change = 0;

void print(std::string_view text)
{
    if (zt_diag::in_signal()) {
        zt_platform::write_standard_error(text);
        return;
    }
    static const std::ios_base::Init streams_are_ready;
    zt_core::write_text(std::cerr, text);
}

void make_default_handler()
{
    const zt_platform::SignalsHeld no_report_from_a_signal;
    zt_diag::reserve_default_handler();
    if (ZtErrHandler::handlerStack || !default_handler_room)
        return;
    default_handler = new (default_handler_room) ZtErrHandler(0);
    default_handler_room = nullptr;
}

ZtErrHandler* top_handler()
{
    if (!ZtErrHandler::handlerStack)
        make_default_handler();
    return ZtErrHandler::handlerStack;
}

// Most reports are below the output level and meet only the default handler,
// which drops them. Making such an error costs a hundred times more than
// finding that out, so it is counted without being made.
bool was_dropped(int level)
{
    if (level >= ZtErrHandler::outputLevel || level >= ZtErrHandler::abortLevel)
        return false;
    const ZtErrHandler* const top = top_handler();
    if (!top || top != default_handler || top->held || top->next)
        return false;
    ++ZtErr::count;
    if (!ZtErrHandler::output)
        ZtErrHandler::output = &std::cerr;
    return true;
}

// Makes and posts a report. Without the memory for it the text goes where it
// would have ended up without other handlers.
void report(Kind kind, int level,
            std::initializer_list<std::string_view> pieces, int system_error)
{
    ZtErr* const made = zt_diag::make_error(kind, level, system_error, pieces);
    errno = system_error;
    if (made) {
        made->Post();
        return;
    }
    if (level >= ZtErrHandler::outputLevel)
        for (const std::string_view piece : pieces)
            print(piece);
    if (level >= ZtErrHandler::abortLevel)
        ZtErrHandler::Abort();
}

int failed_check(Kind kind, std::string_view prefix, const char* text,
                 int level)
{
    if (!was_dropped(level))
        report(kind, level, {prefix, text, "\n"}, oserror());
    return 1;
}

void post_message(Kind kind, int level, std::string_view prefix,
                  const char* format, va_list arguments)
    __attribute__((format(printf, 4, 0)));

void post_message(Kind kind, int level, std::string_view prefix,
                  const char* format, va_list arguments)
{
    if (was_dropped(level))
        return;
    const int system_error = oserror();
    const zt_core::FormattedText formatted(prefix, format, arguments);
    report(kind, level, {formatted.View()}, system_error);
}

std::string_view up_to_nul(std::string_view text)
{
    return text.substr(0, text.find('\0'));
}

// Without the memory for its message an error is printed out of its stream.
void print(ZtErr& unclaimed)
{
    const char* const message = unclaimed.Message();
    print(message == zt_diag::no_text ? up_to_nul(unclaimed.stream.view())
                                      : message);
}

// What becomes of an error that no handler has taken.
void settle(ZtErr* unclaimed)
{
    if (!ZtErrHandler::output)
        ZtErrHandler::output = &std::cerr;
    const int level = unclaimed->level;
    if (level >= ZtErrHandler::outputLevel)
        print(*unclaimed);
    zt_diag::dispose(unclaimed);
    if (level >= ZtErrHandler::abortLevel)
        ZtErrHandler::Abort();
}

ZtErr* as_error(void* item)
{
    return static_cast<ZtErr*>(static_cast<KvoObject*>(item));
}

/// Marks the change of a queue for a signal that interrupts it.
class QueueChange
{
public:
    QueueChange() { queues_in_change = queues_in_change + 1; }
    ~QueueChange() { queues_in_change = queues_in_change - 1; }
    QueueChange(const QueueChange&) = delete;
    QueueChange& operator=(const QueueChange&) = delete;
};

// Returns: false when there was no memory for the error's place.
bool enqueue(ZtErrHandler& handler, ZtErr* held)
{
    const QueueChange change;
    const int before = handler.queue.count;
    handler.queue.PushTail(static_cast<KvoObject*>(held));
    return handler.queue.count != before;
}

// Moves what handlers were to hold back in a signal to their queues. It comes
// before anything else is done to a queue, so errors stay in their order.
void collect_from_signals()
{
    zt_diag::HeldInSignal held = {};
    while (zt_diag::next_held_in_signal(held))
        if (!enqueue(*held.handler, held.error))
            held.handler->Handle(held.error);
}

bool may_change_queues()
{
    if (zt_diag::in_signal())
        return queues_in_change == 0;
    collect_from_signals();
    return true;
}

bool hold_back(ZtErrHandler& handler, ZtErr* delivered)
{
    if (zt_diag::in_signal())
        return zt_diag::hold_in_signal(handler, delivered);
    collect_from_signals();
    return enqueue(handler, delivered);
}
} // namespace

void zt_diag::reserve_default_handler()
{
    if (!default_handler_room && !in_signal())
        default_handler_room =
            ::operator new(sizeof(ZtErrHandler), std::nothrow);
}

ZtErr::ZtErr(const char* text, int error_code, int error_level)
    : code(error_code), level(error_level), system_error(oserror()),
      message(nullptr)
{
    ++count;
    if (text)
        stream << text;
}

ZtErr::~ZtErr()
{
    if (message != zt_diag::no_text)
        delete[] message;
}

char* ZtErr::Message()
{
    if (message)
        return message;
    const std::string_view text = up_to_nul(stream.view());
    message = new (std::nothrow) char[text.size() + 1];
    if (!message)
        return message = zt_diag::no_text;
    text.copy(message, text.size());
    message[text.size()] = '\0';
    return message;
}

void ZtErr::Post()
{
    ZtErrHandler::Post(this);
}

void ZtErr::Abort()
{
    Post();
    ZtErrHandler::Abort();
}

int ZtErr::Check(int value, const char* text, int level)
{
    return value ? 0
                 : failed_check(BadValue, "Error: ", text ? text : "bad value",
                                level);
}

int ZtErr::Check(const void* pointer, const char* text, int level)
{
    return pointer
               ? 0
               : failed_check(BadPointer,
                              "Error: ", text ? text : "bad pointer", level);
}

int ZtErr::Check(std::ios& stream, const char* text, int level)
{
    return stream.rdstate() == std::ios::goodbit
               ? 0
               : failed_check(StreamFailure,
                              "Stream Error: ", text ? text : "failed i/o",
                              level);
}

int ZtErr::CheckSystem(const char* text, int level)
{
    const int number = oserror();
    if (number == 0)
        return 0;
    if (!text)
        text = std::strerror(number);
    errno = number;
    return failed_check(SystemFailure, "System Error: ", text, level);
}

ZtErrHandler::ZtErrHandler(int hold_back) : next(handlerStack), held(hold_back)
{
    handlerStack = this;
}

ZtErrHandler::~ZtErrHandler()
{
    Release();
    if (handlerStack != this) {
        report(Message, error, {"Error: handler stack confused\n"}, oserror());
        Abort();
    }
    handlerStack = next;
    if (default_handler == this)
        default_handler = nullptr;
}

void ZtErrHandler::Deliver(ZtErr* delivered)
{
    if (!delivered)
        return;
    if (!held || !hold_back(*this, delivered))
        Handle(delivered);
}

void ZtErrHandler::Handle(ZtErr* delivered)
{
    if (!delivered)
        return;
    if (next)
        next->Deliver(delivered);
    else
        settle(delivered);
}

void ZtErrHandler::Hold()
{
    held = 1;
}

void ZtErrHandler::Release()
{
    held = 0;
    while (ZtErr* const oldest = Pop())
        Handle(oldest);
    // Only an abort in a signal finds any here, and it comes back no more.
    while (ZtErr* const oldest = zt_diag::take_held_in_signal(*this))
        Handle(oldest);
}

ZtErr* ZtErrHandler::Pop()
{
    if (!may_change_queues())
        return nullptr;
    const QueueChange change;
    return as_error(queue.Pop());
}

ZtErr* ZtErrHandler::PopTail()
{
    if (!may_change_queues())
        return nullptr;
    const QueueChange change;
    return as_error(queue.PopTail());
}

void ZtErrHandler::Post(ZtErr* posted)
{
    if (ZtErrHandler* const top = top_handler())
        top->Deliver(posted);
    else if (posted)
        settle(posted);
}

void ZtErrHandler::Abort()
{
    for (ZtErrHandler* handler = handlerStack; handler; handler = handler->next)
        handler->Release();
    std::abort();
}

void ZtErrHandler::SetOutputStream(std::ostream* stream)
{
    output = stream ? stream : &std::cerr;
}

void ZtDebug(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    post_message(Message, debug, "Debug: ", format, arguments);
    va_end(arguments);
}

void ZtInform(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    post_message(Message, information, "Info: ", format, arguments);
    va_end(arguments);
}

void ZtWarning(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    post_message(Message, warning, "Warning: ", format, arguments);
    va_end(arguments);
}

void ZtError(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    post_message(Message, error, "Error: ", format, arguments);
    va_end(arguments);
}

void ZtStatus(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    post_message(Status, information, "", format, arguments);
    va_end(arguments);
}

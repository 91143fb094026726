#include "ZT/error.h"

#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <new>
#include <string_view>

#include "core/format_text.h"

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
ZtErrHandler* default_handler = nullptr;

// Stands in for a text that could not be kept.
char no_text[1] = "";

void print(const char* text)
{
    static const std::ios_base::Init streams_are_ready;
    std::cerr << text;
}

ZtErrHandler* top_handler()
{
    if (!ZtErrHandler::handlerStack)
        default_handler = new (std::nothrow) ZtErrHandler(0);
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

// Makes and posts a report of up to three pieces of text. Without the memory
// for it the text goes where it would have ended up without other handlers.
void report(Kind kind, int level, const char* prefix, const char* text,
            const char* end, int system_error)
{
    errno = system_error;
    auto* const made = new (std::nothrow) ZtErr(prefix, kind, level);
    if (made) {
        made->stream << text << end;
        if (made->stream.good()) {
            made->Post();
            return;
        }
        delete made;
    }
    if (level >= ZtErrHandler::outputLevel)
        for (const char* piece : {prefix ? prefix : "", text, end})
            print(piece);
    if (level >= ZtErrHandler::abortLevel)
        ZtErrHandler::Abort();
}

int failed_check(Kind kind, const char* prefix, const char* text, int level)
{
    if (!was_dropped(level))
        report(kind, level, prefix, text, "\n", oserror());
    return 1;
}

void post_message(Kind kind, int level, const char* prefix, const char* format,
                  va_list arguments) __attribute__((format(printf, 4, 0)));

void post_message(Kind kind, int level, const char* prefix, const char* format,
                  va_list arguments)
{
    if (was_dropped(level))
        return;
    const int system_error = oserror();
    const zt_core::FormattedText formatted(format, arguments);
    report(kind, level, prefix, formatted.Text(), "", system_error);
}

// What becomes of an error that no handler has taken.
void settle(ZtErr* unclaimed)
{
    if (!ZtErrHandler::output)
        ZtErrHandler::output = &std::cerr;
    const int level = unclaimed->level;
    if (level >= ZtErrHandler::outputLevel)
        print(unclaimed->Message());
    delete unclaimed;
    if (level >= ZtErrHandler::abortLevel)
        ZtErrHandler::Abort();
}

ZtErr* as_error(void* item)
{
    return static_cast<ZtErr*>(static_cast<KvoObject*>(item));
}
} // namespace

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
    if (message != no_text)
        delete[] message;
}

char* ZtErr::Message()
{
    if (message)
        return message;
    std::string_view text = stream.view();
    text = text.substr(0, text.find('\0'));
    message = new (std::nothrow) char[text.size() + 1];
    if (!message)
        return message = no_text;
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
        report(Message, error, "Error: handler stack confused\n", "", "",
               oserror());
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
    if (held) {
        const int before = queue.count;
        queue.PushTail(static_cast<KvoObject*>(delivered));
        if (queue.count != before)
            return;
    }
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
}

ZtErr* ZtErrHandler::Pop()
{
    return as_error(queue.Pop());
}

ZtErr* ZtErrHandler::PopTail()
{
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
    post_message(Status, information, nullptr, format, arguments);
    va_end(arguments);
}

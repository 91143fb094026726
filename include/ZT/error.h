#ifndef ZT_ERROR_H
#define ZT_ERROR_H

/// \file
/// Reports: error objects, the stack of handlers they are posted to, and the
/// five printf-like functions that make most of them.
///
/// Levels are 1 debug, 2 information and status, 3 warning, 4 error, 5 fatal.
/// With the defaults, warnings and errors are printed to standard error,
/// everything below is dropped, and only a fatal error ends the process. A
/// text brings its own newline: nothing here adds one, the checks excepted.

#include <KVO/KvoObjList.h>
#include <ZT/object.h>

#include <cerrno>
#include <ios>
#include <ostream>
#include <sstream>

/// Gives the number of the last failure of a system call.
inline int oserror()
{
    return errno;
}

/// One report: a kind, a level, and a text that is written to `stream`.
///
/// Kinds are 0 message, 1 bad value, 2 bad pointer, 3 stream failure, 4 system
/// error, 5 status message. An error is made with `new` and given away by
/// `Post` or `Abort`; whoever handles it last deletes it.
class ZT_API ZtErr : public KvoObject
{
public:
    /// Makes a report that begins with `text`, and counts it. Null is no text.
    ///
    /// The number of the last system failure is taken before anything else.
    ZtErr(const char* text, int code, int level);

    ZtErr(const ZtErr&) = delete;
    ZtErr& operator=(const ZtErr&) = delete;
    ~ZtErr() override;

    /// Gives the text, up to its first NUL.
    ///
    /// The first call freezes it; what is written to `stream` later is not
    /// seen.
    ///
    /// Owner:   this error.
    /// Returns: the text; empty, never null, when there is no memory to keep
    ///          it.
    char* Message();

    /// Hands this error to the handler stack.
    ///
    /// Owner: the handlers from here on; the caller must not touch it again.
    void Post();

    /// Posts this error, lets every handler release what it holds, and aborts
    /// the process.
    [[noreturn]] void Abort();

    /// Gives the number of the last system failure before this error was made.
    int SystemError() const { return system_error; }

    /// Reports `text`, or "bad value", when `value` is 0.
    ///
    /// Returns: 1 if it reported, else 0.
    /// Reports: "Error: ", the text and a newline, at `level`.
    static int Check(int value, const char* text, int level);

    /// Reports `text`, or "bad pointer", when `pointer` is null.
    ///
    /// Returns: 1 if it reported, else 0.
    /// Reports: "Error: ", the text and a newline, at `level`.
    static int Check(const void* pointer, const char* text, int level);

    /// Reports `text`, or "failed i/o", when any bit of the stream's state is
    /// set, the end included.
    ///
    /// Returns: 1 if it reported, else 0.
    /// Reports: "Stream Error: ", the text and a newline, at `level`.
    static int Check(std::ios& stream, const char* text, int level);

    /// Reports `text`, or the system's own words, when `oserror()` is not 0.
    ///
    /// Returns: 1 if it reported, else 0.
    /// Reports: "System Error: ", the text and a newline, at `level`.
    static int CheckSystem(const char* text, int level);

    static int count; ///< How many errors were ever made.

    int code;  ///< The kind.
    int level; ///< The higher, the more severe.

protected:
    int system_error; ///< Stands before the stream, which may set errno.

public:
    char* message;             ///< The frozen text; null before `Message`.
    std::ostringstream stream; ///< Takes the text until it is frozen.
};

/// One handler of the stack of handlers.
///
/// A handler that is made goes on top of the stack and gets every error that
/// is posted from then on; a subclass that overrides `Handle` catches or
/// redirects them. It passes one on by calling `ZtErrHandler::Handle`, and
/// deletes the ones that it keeps. Handlers are destroyed in the reverse order
/// of their making.
///
/// Context: reports of the timer beat are handled inside the beat. What a
///          subclass does in `Handle` must be allowed there, as deleting the
///          error is; the beat is blocked while a subclass is destroyed.
class ZT_API ZtErrHandler : public KvoObject
{
public:
    /// Makes a handler and puts it on top of the stack.
    ///
    /// With `hold_back` not 0 it keeps what it gets until `Release`. On an
    /// empty stack it becomes the bottom, which prints.
    explicit ZtErrHandler(int hold_back = 0);

    ZtErrHandler(const ZtErrHandler&) = delete;
    ZtErrHandler& operator=(const ZtErrHandler&) = delete;

    /// Releases what is held and takes the handler off the stack.
    ///
    /// A subclass is no longer itself by then: if its own `Handle` is to see
    /// what is held, it calls `Release` in its own destructor.
    ///
    /// Reports: an error "Error: handler stack confused\n" if another handler
    ///          lies on top; then the process aborts.
    ~ZtErrHandler() override;

    /// Takes an error, null is none: keeps it at the end of the queue while
    /// errors are held back, else handles it at once.
    void Deliver(ZtErr* error);

    /// Handles an error: passes it to the next handler below.
    ///
    /// At the bottom, prints the text if the level reaches `outputLevel`,
    /// deletes the error, and aborts if the level reaches `abortLevel`.
    ///
    /// Owner:     takes the error over.
    /// By design: prints to standard error whatever `output` is; that is only
    ///            set to standard error if it is null
    ///            (ZtErrHandler.PrintsToStandardErrorWhateverTheOutputStream).
    virtual void Handle(ZtErr* error);

    /// Holds errors back from now on.
    void Hold();

    /// Ends holding back and handles what is held, oldest first.
    void Release();

    /// Takes the oldest held error out of the queue.
    ///
    /// Owner:   the caller.
    /// Returns: the error, or null.
    ZtErr* Pop();

    /// Takes the newest held error out of the queue.
    ///
    /// Owner:   the caller.
    /// Returns: the error, or null.
    ZtErr* PopTail();

    /// Delivers an error to the handler on top. If there is none, makes the
    /// default handler first, which stays for the life of the process.
    ///
    /// Owner: takes the error over.
    static void Post(ZtErr* error);

    /// Releases every handler, the top first, and aborts the process.
    [[noreturn]] static void Abort();

    /// Sets `output`; null is standard error.
    static void SetOutputStream(std::ostream* stream);

    static ZtErrHandler* handlerStack; ///< The top, or null.
    static int outputLevel;            ///< From here up it is printed; 3.
    static int abortLevel;             ///< From here up it aborts; 5.
    static std::ostream* output;       ///< Kept for hosts; standard error.

    ZtErrHandler* next; ///< The handler below, or null.
    int held;           ///< Not 0 while errors are held back.
    KvoObjList queue;   ///< What is held, oldest first. What was held inside
                        ///< the beat joins it at the next use of a handler.
};

/// Reports a message of level 1 that begins "Debug: ".
///
/// Formats like `printf`, text of any length; a format that the system refuses
/// comes out as it stands. No newline is added.
ZT_API void ZtDebug(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

/// Reports a message of level 2 that begins "Info: ".
ZT_API void ZtInform(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

/// Reports a message of level 3 that begins "Warning: ".
ZT_API void ZtWarning(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

/// Reports a message of level 4 that begins "Error: ".
ZT_API void ZtError(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

/// Reports a message of level 2 with no beginning of its own, kind 5.
ZT_API void ZtStatus(const char* format, ...)
    __attribute__((format(printf, 1, 2)));

#endif

// A library to preload under a program that runs the beat. It watches every
// call of the alarm handler and ends the process with status 99 when something
// below it allocates, frees, locks, throws, or touches a stream.
//
// At the end it tells how many calls it has watched; none is status 98, for
// then it has proved nothing. Children of the process are watched, not counted.

#include <array>
#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <dlfcn.h>
#include <new>
#include <ostream>
#include <pthread.h>
#include <semaphore.h>
#include <signal.h>
#include <unistd.h>

#define CHECKED extern "C" __attribute__((visibility("default")))

extern "C" {
void* __libc_malloc(std::size_t);
void* __libc_calloc(std::size_t, std::size_t);
void* __libc_realloc(void*, std::size_t);
void* __libc_memalign(std::size_t, std::size_t);
void __libc_free(void*);
}

namespace {

using Handler = void (*)(int);

constexpr int proved_nothing = 98;
constexpr int forbidden = 99;

// Initial-exec: the first use in a thread must not allocate.
__attribute__((tls_model("initial-exec"))) thread_local int inside = 0;
std::atomic<long> watched = 0;
std::atomic<Handler> alarm_handler = nullptr;
pid_t counted_process = 0;

void say(const char* text)
{
    if (write(STDERR_FILENO, text, std::strlen(text)) < 0)
        _exit(forbidden);
}

/// Ends the process if the alarm handler has come here.
void check(const char* name)
{
    if (inside == 0)
        return;
    inside = 0;
    say("beat checker: ");
    say(name);
    say(" inside the alarm handler\n");
    _exit(forbidden);
}

void watch(int signal)
{
    ++watched;
    ++inside;
    alarm_handler.load()(signal);
    --inside;
}

template <class Function>
Function* next(const char* name)
{
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

bool is_function(Handler handler)
{
    return handler != SIG_DFL && handler != SIG_IGN && handler != SIG_ERR;
}

/// Sends the alarm to us instead, and tells of its handler as if it had not.
int set_action(int signal, const struct sigaction* wanted,
               struct sigaction* before)
{
    static auto* const real =
        next<int(int, const struct sigaction*, struct sigaction*)>("sigaction");
    if (signal != SIGALRM)
        return real(signal, wanted, before);
    const Handler handler_before = alarm_handler;
    struct sigaction ours = {};
    if (wanted) {
        ours = *wanted;
        if (is_function(wanted->sa_handler)) {
            alarm_handler = wanted->sa_handler;
            ours.sa_handler = watch;
        }
    }
    const int result = real(signal, wanted ? &ours : nullptr, before);
    if (before && before->sa_handler == watch)
        before->sa_handler = handler_before;
    return result;
}

Handler set_handler(int signal, Handler handler, int flags)
{
    struct sigaction wanted = {};
    struct sigaction before = {};
    wanted.sa_handler = handler;
    wanted.sa_flags = flags;
    sigemptyset(&wanted.sa_mask);
    return set_action(signal, &wanted, &before) == 0 ? before.sa_handler
                                                     : SIG_ERR;
}

__attribute__((constructor)) void begin()
{
    counted_process = getpid();
}

__attribute__((destructor)) void end()
{
    if (getpid() != counted_process)
        return;
    char text[80];
    std::snprintf(text, sizeof text,
                  "beat checker: %ld handler calls watched\n", watched.load());
    say(text);
    std::fflush(nullptr);
    if (watched == 0)
        _exit(proved_nothing);
}

void* take(std::size_t bytes)
{
    void* const memory = __libc_malloc(bytes ? bytes : 1);
    if (!memory)
        throw std::bad_alloc();
    return memory;
}

void* take_aligned(std::size_t bytes, std::align_val_t alignment)
{
    void* const memory =
        __libc_memalign(static_cast<std::size_t>(alignment), bytes ? bytes : 1);
    if (!memory)
        throw std::bad_alloc();
    return memory;
}

} // namespace

// Where the alarm goes.

CHECKED int sigaction(int signal, const struct sigaction* wanted,
                      struct sigaction* before) noexcept
{
    return set_action(signal, wanted, before);
}

CHECKED Handler signal(int signal, Handler handler) noexcept
{
    return set_handler(signal, handler, SA_RESTART);
}

CHECKED Handler bsd_signal(int signal, Handler handler) noexcept
{
    return set_handler(signal, handler, SA_RESTART);
}

CHECKED Handler ssignal(int signal, Handler handler) noexcept
{
    return set_handler(signal, handler, SA_RESTART);
}

CHECKED Handler sysv_signal(int signal, Handler handler) noexcept
{
    return set_handler(signal, handler,
                       static_cast<int>(SA_RESETHAND | SA_NODEFER));
}

// The heap.

CHECKED void* malloc(std::size_t bytes) noexcept
{
    check("malloc");
    return __libc_malloc(bytes);
}

CHECKED void* calloc(std::size_t count, std::size_t bytes) noexcept
{
    check("calloc");
    return __libc_calloc(count, bytes);
}

CHECKED void* realloc(void* memory, std::size_t bytes) noexcept
{
    check("realloc");
    return __libc_realloc(memory, bytes);
}

CHECKED void* memalign(std::size_t alignment, std::size_t bytes) noexcept
{
    check("memalign");
    return __libc_memalign(alignment, bytes);
}

CHECKED void* aligned_alloc(std::size_t alignment, std::size_t bytes) noexcept
{
    check("aligned_alloc");
    return __libc_memalign(alignment, bytes);
}

CHECKED int posix_memalign(void** memory, std::size_t alignment,
                           std::size_t bytes) noexcept
{
    check("posix_memalign");
    *memory = __libc_memalign(alignment, bytes);
    return *memory ? 0 : 12;
}

CHECKED char* strdup(const char* text) noexcept
{
    check("strdup");
    const std::size_t bytes = std::strlen(text) + 1;
    void* const copy = __libc_malloc(bytes);
    return static_cast<char*>(copy ? std::memcpy(copy, text, bytes) : nullptr);
}

CHECKED void free(void* memory) noexcept
{
    check("free");
    __libc_free(memory);
}

void* operator new(std::size_t bytes)
{
    check("operator new");
    return take(bytes);
}

void* operator new[](std::size_t bytes)
{
    check("operator new");
    return take(bytes);
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept
{
    check("operator new");
    return __libc_malloc(bytes ? bytes : 1);
}

void* operator new[](std::size_t bytes, const std::nothrow_t&) noexcept
{
    check("operator new");
    return __libc_malloc(bytes ? bytes : 1);
}

void* operator new(std::size_t bytes, std::align_val_t alignment)
{
    check("operator new");
    return take_aligned(bytes, alignment);
}

void* operator new[](std::size_t bytes, std::align_val_t alignment)
{
    check("operator new");
    return take_aligned(bytes, alignment);
}

void operator delete(void* memory) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete[](void* memory) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete[](void* memory, std::size_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete(void* memory, std::align_val_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete[](void* memory, std::align_val_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete(void* memory, std::size_t, std::align_val_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

void operator delete[](void* memory, std::size_t, std::align_val_t) noexcept
{
    check("operator delete");
    __libc_free(memory);
}

// Everything else is called on as it came. `CALL_ON` makes a function of the
// same name and type that checks first.
#define CALL_ON(result, name, parameters, arguments)                           \
    CHECKED result name parameters                                             \
    {                                                                          \
        check(#name);                                                          \
        static auto* const real = next<result parameters>(#name);              \
        return real arguments;                                                 \
    }

// Locks and what waits.

CALL_ON(int, pthread_mutex_lock, (pthread_mutex_t * mutex), (mutex))
CALL_ON(int, pthread_mutex_trylock, (pthread_mutex_t * mutex), (mutex))
CALL_ON(int, pthread_mutex_unlock, (pthread_mutex_t * mutex), (mutex))
CALL_ON(int, pthread_rwlock_rdlock, (pthread_rwlock_t * lock), (lock))
CALL_ON(int, pthread_rwlock_wrlock, (pthread_rwlock_t * lock), (lock))
CALL_ON(int, pthread_rwlock_unlock, (pthread_rwlock_t * lock), (lock))
CALL_ON(int, pthread_spin_lock, (pthread_spinlock_t * lock), (lock))
CALL_ON(int, pthread_cond_wait,
        (pthread_cond_t * condition, pthread_mutex_t* mutex),
        (condition, mutex))
CALL_ON(int, pthread_cond_signal, (pthread_cond_t * condition), (condition))
CALL_ON(int, pthread_cond_broadcast, (pthread_cond_t * condition), (condition))
CALL_ON(int, pthread_once, (pthread_once_t * once, void (*function)()),
        (once, function))
CALL_ON(int, pthread_create,
        (pthread_t * thread, const pthread_attr_t* attributes,
         void* (*function)(void*), void* argument),
        (thread, attributes, function, argument))
CALL_ON(int, sem_wait, (sem_t * semaphore), (semaphore))
CALL_ON(int, __cxa_guard_acquire, (void* guard), (guard))

extern "C" void* __cxa_allocate_exception(std::size_t bytes) noexcept
{
    check("__cxa_allocate_exception");
    static auto* const real =
        next<void*(std::size_t)>("__cxa_allocate_exception");
    return real(bytes);
}

// Stdio, and what else takes a lock inside the C library.

CALL_ON(int, puts, (const char* text), (text))
CALL_ON(int, fputs, (const char* text, FILE* file), (text, file))
CALL_ON(int, putchar, (int character), (character))
CALL_ON(int, putc, (int character, FILE* file), (character, file))
CALL_ON(int, fputc, (int character, FILE* file), (character, file))
CALL_ON(int, fflush, (FILE * file), (file))
CALL_ON(std::size_t, fwrite,
        (const void* from, std::size_t bytes, std::size_t count, FILE* file),
        (from, bytes, count, file))
CALL_ON(std::size_t, fread,
        (void* to, std::size_t bytes, std::size_t count, FILE* file),
        (to, bytes, count, file))
CALL_ON(FILE*, fopen, (const char* path, const char* mode), (path, mode))
CALL_ON(int, fclose, (FILE * file), (file))
CALL_ON(void, flockfile, (FILE * file), (file))
CALL_ON(int, vprintf, (const char* format, va_list arguments),
        (format, arguments))
CALL_ON(int, vfprintf, (FILE * file, const char* format, va_list arguments),
        (file, format, arguments))
CALL_ON(int, vsnprintf,
        (char* to, std::size_t bytes, const char* format, va_list arguments),
        (to, bytes, format, arguments))
CALL_ON(int, __vprintf_chk, (int flag, const char* format, va_list arguments),
        (flag, format, arguments))
CALL_ON(int, __vfprintf_chk,
        (FILE * file, int flag, const char* format, va_list arguments),
        (file, flag, format, arguments))
CALL_ON(int, __vsnprintf_chk,
        (char* to, std::size_t bytes, int flag, std::size_t room,
         const char* format, va_list arguments),
        (to, bytes, flag, room, format, arguments))
CALL_ON(struct tm*, localtime, (const time_t* moment), (moment))
CALL_ON(struct tm*, localtime_r, (const time_t* moment, struct tm* parts),
        (moment, parts))
CALL_ON(time_t, mktime, (struct tm * parts), (parts))
CALL_ON(void, tzset, (), ())
CALL_ON(char*, setlocale, (int category, const char* locale),
        (category, locale))
CALL_ON(void*, dlopen, (const char* path, int mode), (path, mode))

#define CALL_ON_FORMATTED(name, parameters, real, arguments)                   \
    CHECKED int name parameters                                                \
    {                                                                          \
        check(#name);                                                          \
        va_list list;                                                          \
        va_start(list, format);                                                \
        const int result = real arguments;                                     \
        va_end(list);                                                          \
        return result;                                                         \
    }

CALL_ON_FORMATTED(printf, (const char* format, ...), vprintf, (format, list))
CALL_ON_FORMATTED(fprintf, (FILE * file, const char* format, ...), vfprintf,
                  (file, format, list))
CALL_ON_FORMATTED(snprintf,
                  (char* to, std::size_t bytes, const char* format, ...),
                  vsnprintf, (to, bytes, format, list))
CALL_ON_FORMATTED(__printf_chk, (int flag, const char* format, ...),
                  __vprintf_chk, (flag, format, list))
CALL_ON_FORMATTED(__fprintf_chk,
                  (FILE * file, int flag, const char* format, ...),
                  __vfprintf_chk, (file, flag, format, list))
CALL_ON_FORMATTED(__snprintf_chk,
                  (char* to, std::size_t bytes, int flag, std::size_t room,
                   const char* format, ...),
                  __vsnprintf_chk, (to, bytes, flag, room, format, list))

// Streams, at the functions through which text, characters and numbers go.

CALL_ON(
    std::ostream*,
    _ZSt16__ostream_insertIcSt11char_traitsIcEERSt13basic_ostreamIT_T0_ES6_PKS3_l,
    (std::ostream * stream, const char* text, long count),
    (stream, text, count))
CALL_ON(std::ostream*, _ZStlsISt11char_traitsIcEERSt13basic_ostreamIcT_ES5_PKc,
        (std::ostream * stream, const char* text), (stream, text))
CALL_ON(std::ostream*, _ZNSo5writeEPKcl,
        (std::ostream * stream, const char* text, long count),
        (stream, text, count))
CALL_ON(std::ostream*, _ZNSo3putEc, (std::ostream * stream, char character),
        (stream, character))
CALL_ON(std::ostream*, _ZNSo5flushEv, (std::ostream * stream), (stream))
CALL_ON(std::ostream*, _ZNSolsEi, (std::ostream * stream, int number),
        (stream, number))
CALL_ON(std::ostream*, _ZNSo9_M_insertIlEERSoT_,
        (std::ostream * stream, long number), (stream, number))
CALL_ON(std::ostream*, _ZNSo9_M_insertIdEERSoT_,
        (std::ostream * stream, double number), (stream, number))

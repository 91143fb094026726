#include "platform/dynlib.h"

#include <cerrno>
#include <dirent.h>
#include <dlfcn.h>
#include <link.h>
#include <sys/stat.h>

namespace zt_platform {

namespace {

class PosixDynlib final : public Dynlib
{
public:
    void* open(const char* path, Binding binding) override
    {
        return dlopen(path, (binding == Binding::Now ? RTLD_NOW : RTLD_LAZY) |
                                RTLD_LOCAL);
    }

    void* symbol(void* handle, const char* name) override
    {
        return dlsym(handle, name);
    }

    bool is_variable(const void* address, std::size_t& bytes) override
    {
        bytes = 0;
        Dl_info about;
        void* found = nullptr;
        if (!address ||
            !dladdr1(const_cast<void*>(address), &about, &found,
                     RTLD_DL_SYMENT) ||
            !found || about.dli_saddr != address)
            return false;
        const auto* entry = static_cast<const ElfW(Sym)*>(found);
        // Both word sizes keep the type in the same four bits.
        const int type = ELF64_ST_TYPE(entry->st_info);
        if (type != STT_OBJECT && type != STT_COMMON)
            return false;
        bytes = entry->st_size;
        return true;
    }

    void close(void* handle) override { dlclose(handle); }

    const char* error_text() override
    {
        const char* const text = dlerror();
        return text ? text : "unknown error of the loader";
    }

    bool is_special_file(const char* path) override
    {
        struct stat about;
        return ::stat(path, &about) == 0 && !S_ISREG(about.st_mode) &&
               !S_ISDIR(about.st_mode);
    }

    bool list_directory(const char* path, bool (*wanted)(const char* name),
                        NameList& names) override
    {
        DIR* const directory = opendir(path);
        if (!directory)
            return false;
        int fault = 0;
        for (;;) {
            errno = 0;
            const dirent* const entry = readdir(directory);
            if (!entry) {
                fault = errno;
                break;
            }
            if (wanted(entry->d_name) && !names.add(entry->d_name)) {
                fault = ENOMEM;
                break;
            }
        }
        closedir(directory);
        errno = fault;
        return fault == 0;
    }
};

constinit PosixDynlib posix_dynlib;
constinit Dynlib* installed = nullptr;

} // namespace

Dynlib& Dynlib::current()
{
    return installed ? *installed : posix_dynlib;
}

Dynlib* Dynlib::install(Dynlib* other)
{
    Dynlib* const before = installed;
    installed = other;
    return before;
}

} // namespace zt_platform

#include "sound/file_device.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <new>

#include "sound/file_port.h"

namespace zt_sound {

namespace {

constexpr const char* prefix = "file:";
constexpr std::size_t prefix_length = 5;

class FileDevice final : public zt_platform::AudioDevice
{
public:
    const char* name() override { return "file"; }

    zt_platform::AudioPort*
    prepare(const zt_platform::AudioPortConfig& config) override
    {
        for (FilePort& port : ports) {
            port.use_files(played_to(), recorded_from());
            if (port.take(config, values))
                return &port;
        }
        return nullptr;
    }

    zt_platform::AudioParameters& parameters() override { return values; }

    void settle() override
    {
        for (FilePort& port : ports)
            port.settle();
    }

    bool member_name(int index, char* text, std::size_t bytes) override
    {
        if (index != 0)
            return false;
        std::snprintf(text, bytes, "%s", name());
        return true;
    }

    /// Takes the two names that follow the prefix.
    void use_files(const char* wish)
    {
        std::snprintf(names, sizeof names, "%s", wish + prefix_length);
        // A name that does not fit is none.
        if (std::strlen(wish + prefix_length) >= sizeof names)
            names[0] = '\0';
        char* const comma = std::strchr(names, ',');
        input = comma && comma[1] ? comma + 1 : nullptr;
        if (comma)
            *comma = '\0';
    }

    void end()
    {
        for (FilePort& port : ports)
            port.end();
    }

private:
    const char* played_to() const { return *names ? names : nullptr; }
    const char* recorded_from() const { return input; }

    static constexpr int most_ports = 16;
    zt_platform::AudioParameters values;
    FilePort ports[most_ports];
    char names[2 * FilePort::longest_path] = {};
    const char* input = nullptr;
};

// Never destroyed, for ports may be in use until the very end.
alignas(FileDevice) unsigned char room[sizeof(FileDevice)];
constinit FileDevice* device = nullptr;

/// Finishes the files when the process ends or the library is unloaded.
struct Ending
{
    ~Ending()
    {
        if (device)
            device->end();
    }
};

const Ending ending;

} // namespace

bool is_file_wish(const char* wish)
{
    return std::strncmp(wish, prefix, prefix_length) == 0;
}

zt_platform::AudioDevice* file_device(const char* wish)
{
    if (!device)
        device = new (room) FileDevice;
    device->use_files(wish);
    return device;
}

} // namespace zt_sound

#ifndef ZT_TESTS_FAKEAUDIODEVICE_H
#define ZT_TESTS_FAKEAUDIODEVICE_H

#include <cstdint>
#include <vector>

#include "platform/paced_port.h"

class FakeAudioDevice;

/// A port in memory, paced by the clock in use.
class FakeAudioPort final : public zt_platform::PacedPort
{
public:
    long write(const std::int16_t* samples, long count) override;
    long read(std::int16_t* samples, long count) override;
    long filled() override;
    long fillable() override;

    FakeAudioDevice* device = nullptr;

private:
    bool can_open() override;
    void play(long count) override;
    void hear(long count) override;
    void opened() override;
    void closed() override;
    void given_back() override;
};

/// A device that keeps what it is given and records what it was given to; in
/// use while it lives. Nothing in it allocates once it is made.
class FakeAudioDevice final : public zt_platform::AudioDevice
{
public:
    FakeAudioDevice();
    ~FakeAudioDevice();
    FakeAudioDevice(const FakeAudioDevice&) = delete;
    FakeAudioDevice& operator=(const FakeAudioDevice&) = delete;

    const char* name() override { return "fake"; }
    zt_platform::AudioPort*
    prepare(const zt_platform::AudioPortConfig& config) override;
    zt_platform::AudioParameters& parameters() override { return values; }
    void parameters_changed() override { ++changes; }
    void silence_errors() override { ++silenced; }
    bool member_name(int index, char* text, std::size_t bytes) override;

    std::vector<std::int16_t> played;  ///< Through all ports.
    std::vector<std::int16_t> written; ///< The same, with what was discarded.
    std::vector<long> blocks;          ///< What each write was asked to take.
    std::vector<std::int16_t> input;   ///< What is recorded; then silence.
    std::size_t heard = 0;             ///< How much of it was.
    std::vector<zt_platform::AudioPortConfig> opens; ///< That succeeded.
    int open_ports = 0;
    int ready_ports = 0; ///< Open ones included.
    int changes = 0;
    int silenced = 0;

    bool refuses_ports = false; ///< Nothing can be made ready.
    bool refuses_opens = false; ///< What is ready does not open.
    bool gone = false;          ///< The device has vanished.

private:
    static constexpr std::size_t most_samples = 4000000;
    static constexpr int most_ports = 40;
    zt_platform::AudioDevice* before;
    zt_platform::AudioParameters values;
    FakeAudioPort ports[most_ports];
};

#endif

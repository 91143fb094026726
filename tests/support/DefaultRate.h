#ifndef ZT_TESTS_DEFAULTRATE_H
#define ZT_TESTS_DEFAULTRATE_H

#include <KVO/KvoTime.h>

/// Sets the default frame rate while it lives.
class DefaultRate
{
public:
    explicit DefaultRate(int fps) : before(KvoTime::default_fps)
    {
        KvoTime::default_fps = fps;
    }
    ~DefaultRate() { KvoTime::default_fps = before; }
    DefaultRate(const DefaultRate&) = delete;
    DefaultRate& operator=(const DefaultRate&) = delete;

private:
    int before;
};

#endif

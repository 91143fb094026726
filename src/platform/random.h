#ifndef ZT_PLATFORM_RANDOM_H
#define ZT_PLATFORM_RANDOM_H

/// \file
/// The door to the system's random numbers.
///
/// There is one sequence for the whole process. A host that seeds it gets the
/// same skip lists and the same noise again.

namespace zt_platform {

/// The process's sequence of random numbers.
class Random
{
public:
    /// Draws the next number of the sequence.
    ///
    /// Units: 0 to 2147483647, each bit as good as a thrown coin.
    virtual long draw() = 0;

    /// Starts another sequence, chosen by the seconds of the wall clock.
    virtual void seed_from_time() = 0;

    /// Starts the sequence that belongs to `number`, the same each time.
    virtual void seed(unsigned number) = 0;

    /// Gives the calls in use: the system's, or those that a test installed.
    static Random& current();

    /// Installs other calls; null restores the system's.
    ///
    /// Owner:   the caller, who installs others before destroying them.
    /// Returns: what was installed before, null for the system's.
    static Random* install(Random* other);

protected:
    ~Random() = default;
};

} // namespace zt_platform

#endif

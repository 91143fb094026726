#ifndef ZT_TESTS_TEMPDIR_H
#define ZT_TESTS_TEMPDIR_H

#include <string>

/// A directory of the test's own, removed with all it holds at the end.
class TempDir
{
public:
    TempDir();
    ~TempDir();
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    /// Gives the path of `name` in the directory; the file need not exist.
    std::string Path(const std::string& name) const;

    /// Writes a file of exactly these bytes and gives its path.
    std::string Write(const std::string& name, const std::string& bytes) const;

    /// Reads a file of the directory whole; fails the test if it cannot.
    std::string Read(const std::string& name) const;

private:
    std::string directory;
};

#endif

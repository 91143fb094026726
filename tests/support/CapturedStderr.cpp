#include "support/CapturedStderr.h"

#include <cstdio>
#include <filesystem>
#include <iostream>
#include <stdlib.h>
#include <unistd.h>

#include <gtest/gtest.h>

CapturedStderr::CapturedStderr() : kept(-1), taken(-1)
{
    std::cerr.flush();
    std::fflush(stderr);
    std::string pattern =
        (std::filesystem::temp_directory_path() / "zt_stderr_XXXXXX").string();
    taken = mkstemp(pattern.data());
    EXPECT_GE(taken, 0);
    unlink(pattern.c_str());
    kept = dup(2);
    dup2(taken, 2);
}

CapturedStderr::~CapturedStderr()
{
    std::cerr.flush();
    std::fflush(stderr);
    dup2(kept, 2);
    close(kept);
    close(taken);
}

std::string CapturedStderr::Text() const
{
    std::cerr.flush();
    std::fflush(stderr);
    std::string text;
    char block[4096];
    off_t offset = 0;
    for (ssize_t got; (got = pread(taken, block, sizeof block, offset)) > 0;
         offset += got)
        text.append(block, static_cast<std::size_t>(got));
    return text;
}

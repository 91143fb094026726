#include "support/FakeProcesses.h"

FakeProcesses::FakeProcesses() : before(install(this)) {}

FakeProcesses::~FakeProcesses()
{
    install(before);
}

int FakeProcesses::run_shell(const char* command)
{
    commands.emplace_back(command ? command : "(null)");
    return result;
}

bool FakeProcesses::change_directory(const char* path)
{
    directories.emplace_back(path ? path : "(null)");
    return path != nullptr;
}

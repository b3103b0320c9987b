// The start of the preloaded object: it finds the console that the tool has made, and answers for it from
// then on.

#include <console/device_calls.h>
#include <console/environment.h>

#include <cstdlib>

#include <sys/mman.h>
#include <sys/stat.h>

namespace {

/// Null if there is no console behind the descriptor, as in programs that outlive the tool and closed it.
console::State* MapState(int fd)
{
    struct stat status {};
    if (fstat(fd, &status) == -1 || status.st_size < static_cast<off_t>(sizeof(console::State)))
        return nullptr;
    void* const memory = mmap(nullptr, sizeof(console::State), PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    if (memory == MAP_FAILED) return nullptr;
    auto* const state = static_cast<console::State*>(memory);
    if (state->magic == console::State::kMagic && state->size == sizeof(console::State)) return state;
    munmap(memory, sizeof(console::State));
    return nullptr;
}

__attribute__((constructor(101))) void AttachToTool()
{
    char const* const text = std::getenv(console::kStateVariable);
    if (text == nullptr) return;
    char* end = nullptr;
    long const fd = std::strtol(text, &end, 10);
    if (end != text && *end == '\0') console::Attach(MapState(static_cast<int>(fd)));
}

}

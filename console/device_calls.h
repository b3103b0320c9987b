#pragma once

#include <console/state.h>

#include <cstddef>
#include <optional>

#include <sys/types.h>

namespace console {

/// Makes this process' device calls go to a console; null gives them back to the kernel. The state must stay
/// until then, and until calls that are under way have returned.
void Attach(State* state);

/// The device calls as libc has them, for what belongs to the attached console. Each gives nothing if the
/// call concerns something else and is to be passed on, with errno untouched; else the call's result, with
/// errno set as libc sets it. Any thread, signal handlers too; the heap is never used.
std::optional<int> OpenDevice(char const* path, int flags);
std::optional<int> ControlDevice(int fd, unsigned long number, void* argument);
std::optional<ssize_t> WriteDevice(int fd, void const* data, std::size_t length);
/// Only ever a failure: memory is mapped by the kernel.
std::optional<int> MapDevice(int fd);
/// What it has mapped. In the 4-plane mode the controller stands before it from now on.
void OnMapped(int fd, void* memory, std::size_t length);
/// Ports of the VGA adapter alone.
std::optional<int> AllowPorts(unsigned long from, unsigned long count);

}

#pragma once

#include <console/virtual_console.h>
#include <support/child_process.h>
#include <tessella/session.h>

#include <gtest/gtest.h>

struct Sizes {
    unsigned width = 1, height = 2, depth = 3;

    bool operator==(Sizes const&) const = default;
};

inline bool Init(Sizes& sizes) { return GrInit(sizes.width, sizes.height, sizes.depth, 0); }

/// Runs `body` on a console of its own, in a process of its own, as there is one session a process. What it
/// expects is reported by the parent.
template <typename Body>
ChildOutcome OnConsole(char const* mode, char const* format, Body body)
{
    ChildOutcome outcome = RunChild([&] {
        console::Setup setup{*console::ParseMode(mode), {}, {}};
        if (format) setup.format = console::ParseFormat(format);
        console::VirtualConsole screen(setup);
        screen.AttachProcess();
        body(screen);
        return testing::Test::HasFailure() ? 1 : 0;
    });
    EXPECT_EQ(outcome.status, 0) << outcome.out << outcome.err;
    return outcome;
}

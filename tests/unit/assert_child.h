#pragma once

#include <support/child_process.h>

#include <cstdlib>

inline void SetVariable(char const* name, char const* value)
{
    value != nullptr ? setenv(name, value, 1) : unsetenv(name);
}

/// Runs `body` under the given settings in a process of its own, since they are read once per process.
template <class Body, class... Parent>
ChildOutcome RunChild(char const* settings, char const* logFile, Body body, Parent... parent)
{
    auto const withSettings = [=] {
        SetVariable("VELLUM_SAFE_ASSERT", settings);
        SetVariable("VELLUM_SAFE_ASSERT_LOGFILE", logFile);
        return body();
    };
    return RunChild(withSettings, parent...);
}

#pragma once

#include <cstdio>
#include <cstdlib>
#include <random>

/// The seed of a test that differs from run to run, printed. TESSELLA_SEED repeats a run.
inline unsigned NewSeed()
{
    char const* const given = std::getenv("TESSELLA_SEED");
    unsigned const seed =
        given ? static_cast<unsigned>(std::strtoul(given, nullptr, 10)) : std::random_device{}();
    std::printf("TESSELLA_SEED=%u\n", seed);
    return seed;
}

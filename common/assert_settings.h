#pragma once

#include <cstdint>

/// What is done with a failed assertion. The values are what an operator may write as a number.
enum AssertFlags : std::uint64_t {
    AssertBreak = 0x01,   ///< trap if a debugger is attached
    AssertDebug = 0x02,   ///< text to the debug channel, which shows nothing on this system
    AssertLog = 0x04,     ///< text to the log target
    AssertEvent = 0x08,   ///< text to the event sink
    AssertMsgBox = 0x10,  ///< as AssertBreak when the failing expression is known
    AssertAbort = 0x20,   ///< abort() at the end
    AssertStack = 0x40,   ///< the call stack as well, on the channels that are on
    AssertOff = ~std::uint64_t{0},
};

enum class AssertLogTarget { Stdout, Stderr, File };

struct AssertSettings {
    std::uint64_t flags = AssertDebug | AssertLog | AssertEvent | AssertStack;
    AssertLogTarget logTarget = AssertLogTarget::Stderr;
    int logFile = -1;  ///< open for appending if the target is File; the end of the process closes it
};

/// Reads VELLUM_SAFE_ASSERT: a hexadecimal number of flags, or words separated by blanks. A word that is
/// not known turns assertions off. With the log on, VELLUM_SAFE_ASSERT_LOGFILE names its target: "stdout",
/// "stderr" or a file, which is opened for appending; if that fails the target stays as it was.
AssertSettings ReadAssertSettings();

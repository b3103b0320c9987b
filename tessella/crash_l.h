#pragma once

#include <csignal>

/// Answers segmentation faults from now on, also when the session is over.
void InstallCrashHandler();

/// Ends the session, so that the console is a text console again, tells on the standard error stream what the
/// faulting thread was doing, and aborts. Nothing is checked: a second fault, from an address that the report
/// follows, ends the process where the report stands. A signal handler.
[[noreturn]] void GrCrashHandler(int signal, siginfo_t* info, void* context);

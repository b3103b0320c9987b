#pragma once

/// The handler of the signal by which the kernel asks for the console, because the user wants another one,
/// and tells of its return. Both have to come to the same thread, the application's: on leaving it takes the
/// screen for its thread, after waiting for whatever is being drawn on others, and on the return it gives it
/// back, to be painted anew.
void GrConsoleSignal(int number);

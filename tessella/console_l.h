#pragma once

/// The handler of the signal by which the kernel asks for the console, because the user wants another one,
/// and tells of its return. For now the answer is no: nobody would repaint the screen afterwards.
void GrConsoleSignal(int number);

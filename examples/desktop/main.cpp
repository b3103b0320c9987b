// A small desktop: frames that cast shadows, a menu bar, pictures, a sheet to draw on, a note that is typed
// in the layout of one's choice, the shapes of the pointer, and a window that is no rectangle. Frames are
// dragged by their titles; Ctrl and Q ends, as does the first menu.
#include "desktop.h"

#include <iostream>

int main(int, char** argv)
{
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    desktop::Desktop().Run();
    GrDone();
}

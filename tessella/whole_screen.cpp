#include <tessella/whole_screen.h>

#include <tessella/screen.h>

constinit GrScreenRecord GrScreen;

GrRegion WholeScreen()
{
    return GrRect{0, 0, static_cast<int>(GrScreen.width), static_cast<int>(GrScreen.height)};
}

void ClearScreen()
{
    if (!GrScreen.context) return;  // a change of mode has failed
    GrScreen.context->SetForeColor(0);
    GrScreen.context->FillRegion(WholeScreen());
}

void DeleteScreenContext()
{
    delete GrScreen.context;
    GrScreen.context = nullptr;
    delete[] GrScreen.ditherLine;
    GrScreen.ditherLine = nullptr;
}

#include <tessella/pixel/screen_base.h>

#include <sys/mman.h>

bool GrScreenContextBase::HasPixels()
{
    return GrScreen.fbMemory != nullptr && GrScreen.fbMemory != MAP_FAILED;
}

#include <tessella/mouse.h>

std::uint32_t mouseButtons = 7;
std::uint32_t emulatedButtons = 7;
int mouseFd = -1;

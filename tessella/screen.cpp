#include <tessella/screen.h>

constinit GrScreenRecord GrScreen;

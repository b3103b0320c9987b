#include <common/library_path.h>

#include <cstdio>

int main() { std::fputs(GetLibraryPath(), stdout); }

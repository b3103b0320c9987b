#pragma once

/// Everything that the library offers to applications.
#include <tessella/bitmap.h>
#include <tessella/color.h>
#include <tessella/context.h>
#include <tessella/cursor.h>
#include <tessella/event.h>
#include <tessella/export.h>
#include <tessella/font.h>
#include <tessella/image.h>
#include <tessella/keyboard.h>
#include <tessella/region.h>
#include <tessella/screen.h>
#include <tessella/session.h>
#include <tessella/types.h>
#include <tessella/window.h>

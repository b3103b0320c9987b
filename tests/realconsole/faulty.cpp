// A program on a text console that ends in a segmentation fault, as its argument says: at a key, in the paint
// handler of what a key has made due, or in the midst of the mouse's motion; else when it is sent the signal.

#include <tessella.h>

#include <string_view>
#include <utility>

int main(int, char** words)
{
    std::string_view const wanted = words[1];
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) return 1;
    GrEvent event;
    bool painted = false;
    for (int moves = 0; moves < 10 || wanted != "mouse";) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventMouseMove) ++moves;
        bool const pressed = event.type == GrEventKeyDown;
        if (pressed && wanted == "key") break;
        if (pressed) GrWindow::RootWindow()->Invalidate();
        if (event.type != GrEventPaint) continue;
        GrContext& context = *event.window->GetContext();
        context.SetForeColor(GrMakeColor(32, 96, 160));
        context.FillRegion(event.rect);
        if (wanted == "paint" && std::exchange(painted, true)) break;
        event.window->FreeContext(&context);
    }
    volatile int* volatile nowhere = nullptr;
    *nowhere = 1;
}

// A picture book of what the library draws, a page a topic. A click or the wheel turns the pages, a right
// click ends; a number on the command line opens the book at that page. On the last page the pointer takes
// the shape that it points at.
#include "cursors.h"
#include "pages.h"

#include <charconv>
#include <cstring>
#include <iostream>

namespace {

using namespace gallery;

int screenWidth, screenHeight;
int page = 0;  // the one that is open

int PageCount() { return static_cast<int>(Pages().size()); }

void Paint(GrEvent const& event)
{
    GrContext* const context = event.window->GetContext();
    Pages()[static_cast<std::size_t>(page)].draw(
        {*context, {static_cast<int>(GrScreen.depth), 0}, screenWidth, screenHeight});
    event.window->FreeContext(context);
}

void Turn(int pages)
{
    page = (page + pages + PageCount()) % PageCount();
    GrWindow::RootWindow()->Invalidate();
}

/// What the pointer is to look like at a place of the screen.
int CursorAt(int x, int y)
{
    for (int i = 0; i < kCursorCount && page == PageCount() - 1; ++i) {
        GrRect const plate =
            PlateOnPage(screenWidth, screenHeight, kCursorColumns, kCursorCount / kCursorColumns, i);
        if (x >= plate.x1 && x < plate.x2 && y >= plate.y1 && y < plate.y2) return i;
    }
    return 0;
}

/// False if the words are no number of a page.
bool ReadPage(int argc, char** argv)
{
    if (argc < 2) return true;
    char const* const end = argv[1] + std::strlen(argv[1]);
    auto const [read, error] = std::from_chars(argv[1], end, page);
    --page;  // people count from 1
    return argc == 2 && error == std::errc() && read == end && page >= 0 && page < PageCount();
}

void ShowPages()
{
    int shape = 0;
    auto cursor = NewCursor(shape);
    cursor->Activate();
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) Paint(event);
        if (event.type == GrEventLeftDown || event.type == GrEventWheelDown) Turn(1);
        if (event.type == GrEventWheelUp) Turn(-1);
        if (event.type == GrEventRightDown) break;
        if (event.type != GrEventPaint && CursorAt(event.x, event.y) != shape) {
            shape = CursorAt(event.x, event.y);
            auto next = NewCursor(shape);
            next->Activate();  // before the one that it follows goes
            cursor = std::move(next);
        }
    }
}

}

int main(int argc, char** argv)
{
    if (!ReadPage(argc, argv)) {
        std::cerr << "usage: gallery [PAGE], from 1 to " << PageCount() << '\n';
        return 2;
    }
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    screenWidth = static_cast<int>(width);
    screenHeight = static_cast<int>(height);
    ShowPages();
    GrDone();
}

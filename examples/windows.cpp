// Overlapping windows to play with: a click raises a window, dragging moves it, the wheel lowers and raises
// it, a right click hides it. A click on the ground shows the hidden ones again, a right click there ends.
// Keys can do it without a mouse: F10 turns the arrow yellow, and they move it and press its buttons.
//
// Each window paints a pattern of its own, and tally marks that tell how often it was asked to paint: for
// itself, or for a shadow that falls on it.
#include <tessella.h>

#include <cstring>
#include <iostream>
#include <iterator>
#include <memory>
#include <tuple>
#include <utility>
#include <vector>

namespace {

/// What the program keeps of a window, root included, behind its `userData`.
struct Pane {
    GrColor fore, back;
    std::uint8_t pattern[8];
    unsigned paints = 0;
    std::unique_ptr<GrWindow> window;
};

constexpr GrColor kInk = GrMakeColor(16, 16, 24);
constexpr std::uint8_t kSolid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};

std::vector<std::unique_ptr<Pane>> panes;
Pane ground{
    GrMakeColor(40, 56, 72), GrMakeColor(32, 44, 60), {0x11, 0x22, 0x44, 0x88, 0x11, 0x22, 0x44, 0x88}};

Pane& PaneOf(GrWindow const& window)
{
    return window.userData ? *static_cast<Pane*>(window.userData) : ground;
}

/// Strokes in groups of five, of which the fifth crosses the others, in a field around `centre` below the
/// window's top.
void DrawTally(GrContext& context, unsigned count, int centre)
{
    int const left = centre - 34;
    context.SetForeColor(GrMakeColor(248, 244, 232));
    context.FillRegion(GrRect{left, 12, left + 68, 34});
    context.SetForeColor(kInk);
    count %= 20;  // the field holds no more
    for (unsigned i = 0; i < count; ++i) {
        int const group = left + 6 + static_cast<int>(i / 5) * 16;
        int const stroke = group + static_cast<int>(i % 5) * 3;
        context.FillRegion(
            i % 5 == 4 ? GrRect{group - 2, 22, group + 13, 24} : GrRect{stroke, 15, stroke + 2, 31});
    }
}

/// The edge of a shape: what remains when its moved twins are taken away from it.
GrRegion Edge(GrRegion const& shape)
{
    GrRegion inner(shape);
    for (auto const& [dx, dy] : {GrRange{2, 0}, GrRange{-2, 0}, GrRange{0, 2}, GrRange{0, -2}}) {
        GrRegion twin(shape);
        twin.Offset(dx, dy);
        inner &= twin;
    }
    GrRegion edge(shape);
    edge -= inner;
    return edge;
}

void Paint(GrEvent const& event)
{
    GrWindow& window = *event.window;
    Pane& pane = PaneOf(window);
    ++pane.paints;
    GrContext* const context = window.GetContext();
    GrRegion shape = window.region;
    shape.Offset(-window.bounds.x1, -window.bounds.y1);
    // The context reaches over the window's shadow, too.
    if (window.shadow) context->SetClipRegion(shape);
    context->SetForeColor(pane.fore);
    context->SetBackColor(pane.back);
    context->SetPattern(pane.pattern, window.bounds.x1, window.bounds.y1, false);
    context->FillRegion(event.rect);
    context->SetPattern(kSolid, 0, 0, false);
    if (window.parent) {
        context->SetForeColor(kInk);
        context->FillRegion(Edge(shape));
    }
    DrawTally(*context, pane.paints, (window.bounds.x2 - window.bounds.x1) / 2);
    window.FreeContext(context);
}

/// Windows tell about themselves; paint that somebody wants at once comes here, too.
void OnWindowEvent(GrEvent const& event)
{
    if (event.type == GrEventPaint) Paint(event);
}

GrWindow& Add(GrWindow& parent, GrRect const& place)
{
    auto const number = static_cast<std::uint8_t>(panes.size());
    auto pane = std::make_unique<Pane>();
    pane->fore = GrMakeColor(static_cast<std::uint8_t>(90 + number * 53 % 160),
        static_cast<std::uint8_t>(90 + number * 97 % 160), static_cast<std::uint8_t>(90 + number * 31 % 160));
    pane->back = GrMakeColor(232, 228, 216);
    for (int row = 0; row < 8; ++row)
        pane->pattern[row] = static_cast<std::uint8_t>((0x33 + number * 0x1D) << row % (number % 4 + 1));
    pane->window = std::make_unique<GrWindow>(
        &parent, place.x1, place.y1, place.x2 - place.x1, place.y2 - place.y1, pane.get());
    panes.push_back(std::move(pane));
    return *panes.back()->window;
}

GrRegion Ring(int size)
{
    GrRegion ring;
    for (int y = 0; y < size; ++y) {
        auto const halfWidth = [&](int radius) {
            int const dy = 2 * y + 1 - size;
            int half = 0;
            while (4 * half * half + dy * dy <= 4 * radius * radius)
                ++half;
            return half;
        };
        int const outer = halfWidth(size / 2), inner = halfWidth(size / 5);
        ring += GrRect{size / 2 - outer, y, size / 2 + outer, y + 1};
        ring -= GrRect{size / 2 - inner, y, size / 2 + inner, y + 1};
    }
    return ring;
}

void BuildWindows()
{
    GrWindow& root = *GrWindow::RootWindow();
    for (int i = 0; i < 6; ++i)
        Add(root, {40 + i * 70, 60 + i * 45, 260 + i * 70, 210 + i * 45}).SetShadowed(i % 2 != 0);
    GrWindow& family = Add(root, {60, 260, 330, 440});
    Add(family, {90, 310, 190, 400});
    GrWindow& child = Add(family, {170, 290, 400, 380});  // sticks out, and is cut
    Add(child, {190, 330, 270, 370});
    GrRegion corner = GrRect{0, 0, 200, 60};
    corner += GrRect{0, 60, 70, 180};
    for (auto const& [left, top, shape] :
        {std::tuple{380, 40, Ring(190)}, std::tuple{250, 270, std::move(corner)}}) {
        GrWindow& shaped = Add(root, {left, top, left + 1, top + 1});
        shaped.SetWindowRegion(shape);
        shaped.SetShadowed(true);
    }
    for (auto const& pane : panes)
        pane->window->Show();
}

/// An arrow with its tip as the hot spot: '#' is ink, '.' paper, anything else is seen through.
std::unique_ptr<GrCursor> MakeArrow(GrColor paper)
{
    static constexpr char const* kRows[] = {"#", "##", "#.#", "#..#", "#...#", "#....#", "#.....#",
        "#......#", "#.......#", "#........#", "#.....#####", "#..#..#", "#.# #..#", "##  #..#", "#    #..#",
        "     #..#", "      ##"};
    int const width = 11, height = static_cast<int>(std::size(kRows));
    auto image = std::make_unique<GrImage>(width, height, GrImageHasAlpha);
    for (int y = 0; y < height; ++y)
        for (int x = 0, end = static_cast<int>(std::strlen(kRows[y])); x < width; ++x) {
            char const dot = x < end ? kRows[y][x] : ' ';
            GrColor const color = dot == '.' ? paper : dot == '#' ? kInk : 0;
            std::memcpy(image->pixels + (y * width + x) * 4, &color, 4);
            image->alphaPlane[y * width + x] = dot == ' ' ? 0 : 255;
        }
    return std::unique_ptr<GrCursor>(GrCursor::CreateInstance(image.release(), nullptr, 0, 0));
}

/// The arrow is white, and yellow while keys move it.
struct Arrows {
    std::unique_ptr<GrCursor> white = MakeArrow(GrMakeColor(255, 255, 255));
    std::unique_ptr<GrCursor> yellow = MakeArrow(GrMakeColor(255, 208, 32));
};

void ShowArrow(void* arrows, bool movedByKeys)
{
    auto const& [white, yellow] = *static_cast<Arrows*>(arrows);
    (movedByKeys ? yellow : white)->Activate();
}

/// What lies under a shadow is painted only if the shadow itself goes.
void Lower(GrWindow& window)
{
    bool const hasShadow = window.shadow != nullptr;
    window.SetShadowed(false);
    window.Lower();
    window.SetShadowed(hasShadow);
}

/// Brings a window, and the family that it belongs to, to the top.
void RaiseFamily(GrWindow& window)
{
    for (GrWindow* member = &window; member; member = member->parent)
        member->Raise();
}

}

int main(int, char** argv)
{
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    GrWindow::SetCallback(OnWindowEvent);
    BuildWindows();
    Arrows arrows;
    GrSetMouseEmulationNotify(ShowArrow, &arrows);

    GrWindow* dragged = nullptr;
    int grabX = 0, grabY = 0;  // where on it the pointer holds the dragged window
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr) || !event.window) continue;  // keys belong to no window
        GrWindow& window = *event.window;
        bool const onGround = !window.parent;
        if (event.type == GrEventPaint) {
            Paint(event);
        } else if (event.type == GrEventLeftDown && onGround) {
            for (auto const& pane : panes)
                pane->window->Show();
        } else if (event.type == GrEventLeftDown) {
            RaiseFamily(window);
            dragged = &window;
            grabX = event.x - window.bounds.x1;
            grabY = event.y - window.bounds.y1;
        } else if (event.type == GrEventMouseMove && dragged) {
            dragged->Move(event.x - grabX, event.y - grabY);
        } else if (event.type == GrEventLeftUp) {
            dragged = nullptr;
        } else if (event.type == GrEventWheelDown && !onGround) {
            Lower(window);
        } else if (event.type == GrEventWheelUp) {
            window.Raise();
        } else if (event.type == GrEventRightDown && !onGround) {
            window.Hide();
        } else if (event.type == GrEventRightDown) {
            break;
        }
    }
    while (!panes.empty())
        panes.pop_back();  // children before their parents
    GrDone();
}

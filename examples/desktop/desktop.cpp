#include "desktop.h"

#include "scenes.h"

namespace desktop {

namespace {

constexpr int kFirstConsole = 2, kConsoles = 4;  // that one can go to

Desktop* running = nullptr;

void TellWindowEvent(GrEvent const& event)
{
    if (running) running->OnWindowEvent(event);
}

void TellLanguage()
{
    if (running) running->OnLanguage();
}

/// Places are told for a screen of 1024 by 768, and smaller screens have smaller things on them.
GrRect Scaled(GrRect const& place)
{
    GrRect const& screen = GrWindow::RootWindow()->bounds;
    int const left = place.x1 * screen.x2 / 1024;
    int const top = kBarHeight + (place.y1 - kBarHeight) * (screen.y2 - kBarHeight) / (768 - kBarHeight);
    int const scale = std::clamp(std::min(screen.x2 * 768, screen.y2 * 1024) / 1024, 512, 768);
    return {left, top, left + (place.x2 - place.x1) * scale / 768, top + (place.y2 - place.y1) * scale / 768};
}

}

Desktop::Desktop()
{
    running = this;
    GrWindow::SetCallback(TellWindowEvent);
    LoadFaces();
    LoadPointers();
    GrRect const& screen = GrWindow::RootWindow()->bounds;
    wallpaper = NewScene(Wallpaper, {screen.x2, screen.y2});

    AddFrame<PointerBoard>(Word::Pointers, {728, 474, 944, 618});
    AddFrame<Canvas>(Word::Drawing, {484, 100, 924, 412});
    AddFrame<Viewer>(Word::Picture, {72, 86, 520, 396});
    AddFrame<Note>(Word::Note, {148, 476, 648, 624});
    note = static_cast<Note*>(&frames.back()->Content());
    hexagon = std::make_unique<Hexagon>(Scaled({852, 588, 1004, 720}));
    hexagon->Window().Show();
    bar = std::make_unique<Bar>();
    FillBar();
    bar->Window().Show();
    if (char16_t const* const layout = GrGetKeyboardLayout()) {
        note->SetLayout(layout);
        bar->SetLayout(layout);
    }
    Activate(frames.back().get());
    ListenToLanguage(TellLanguage);
}

Desktop::~Desktop()
{
    IgnoreLanguage(TellLanguage);
    bar.reset();
    hexagon.reset();
    frames.clear();
    FreePointers();
    FreeFaces();
    running = nullptr;
}

template <typename Content>
void Desktop::AddFrame(Word title, GrRect const& place)
{
    frames.push_back(std::make_unique<Frame>(Scaled(place), title));
    frames.back()->Hold<Content>();
    frames.back()->Window().Show();
}

void Desktop::FillBar()
{
    auto const say = [](Word word) { return [word] { return std::u16string(Say(word)); }; };
    bar->Add([] { return u"Tessella"; }, {{say(Word::Quit), [this] { isOver = true; }}});

    std::vector<Item> windows;
    windows.reserve(frames.size() + 1);
    for (auto const& frame : frames)
        windows.push_back({say(frame->Title()), [this, &frame = *frame] { Toggle(frame); },
            [&frame = *frame] { return frame.Window().IsVisible(); }});
    windows.push_back({say(Word::Hexagon),
        [this] {
            GrWindow& window = hexagon->Window();
            window.IsVisible() ? window.Hide() : window.Show();
        },
        [this] { return hexagon->Window().IsVisible(); }});
    bar->Add(say(Word::Windows), std::move(windows));

    std::vector<Item> languages;
    languages.reserve(kLanguageCount);
    for (int i = 0; i < kLanguageCount; ++i)
        languages.push_back({[i] { return std::u16string(kLanguages[i].name); }, [i] { SpeakLanguage(i); },
            [i] { return LanguageInForce() == i; }});
    bar->Add(say(Word::Language), std::move(languages));

    std::vector<Item> consoles;
    consoles.reserve(kConsoles);
    for (int number = kFirstConsole; number < kFirstConsole + kConsoles; ++number)
        consoles.push_back(
            {[number] { return std::u16string(Say(Word::SwitchTo)) + static_cast<char16_t>(u'0' + number); },
                [number] { SwitchToConsole(number); }});
    bar->Add(say(Word::Console), std::move(consoles));
}

void Desktop::Run()
{
    for (GrEvent event; !isOver;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint)
            Paint(event);
        else if (event.type == GrEventKeyDown || event.type == GrEventKeyUp)
            OnKey(event);
        else
            OnMouse(event);
    }
}

void Desktop::OnWindowEvent(GrEvent const& event)
{
    if (event.type == GrEventPaint) Paint(event);
    if (event.type == GrEventLayoutChanged) {
        note->SetLayout(event.layoutName);
        bar->SetLayout(event.layoutName);
    }
}

void Desktop::OnLanguage()
{
    bar->Relabel();
    GrWindow::RootWindow()->FullInvalidate(true);
}

void Desktop::Paint(GrEvent const& event)
{
    if (PaneOf(event.window)) return PaintPane(event);
    GrContext* const context = event.window->GetContext();
    context->DrawImage(event.rect, *wallpaper, event.rect.x1, event.rect.y1);
    event.window->FreeContext(context);
}

void Desktop::OnMouse(GrEvent const& event)
{
    Pane* const pane = held ? held : PaneOf(event.window);
    GrRect const bounds = pane ? pane->Window().bounds : GrRect{};
    Point const at = {event.x - bounds.x1, event.y - bounds.y1};
    switch (event.type) {
    case GrEventLeftDown:
        if (!bar->Owns(pane)) bar->CloseMenu();
        if (!pane) return;
        held = pane;
        if (Frame* const frame = FrameOf(*event.window)) Activate(frame);
        if (pane == hexagon.get()) pane->Window().Raise();
        if (!bar->Owns(pane)) bar->Window().Raise();
        pane->Press(at);
        break;
    case GrEventLeftUp:
        if (!held) return;
        held = nullptr;
        pane->Release(at);
        if (bar->Owns(pane) && pane != bar.get()) bar->CloseMenu();
        if (active && !active->Window().IsVisible()) Activate(TopFrame());
        break;
    case GrEventWheelUp:
    case GrEventWheelDown:
        if (pane) pane->Wheel(event.type == GrEventWheelUp ? -1 : 1);
        break;
    case GrEventMouseMove:
        if (held) held->Drag(at);
        break;
    default: return;
    }
    PointAt({event.x, event.y});
}

/// The pointer is at a point of the screen: its shape, and whatever lights up.
void Desktop::PointAt(Point at)
{
    Pane* const pane = held ? held : PaneOf(GrWindow::WindowAtXY(at.x, at.y, false));
    if (pointed && pointed != pane) pointed->Leave();
    pointed = pane;
    if (!pane) return ShowPointer(Pointer::Arrow);
    GrRect const& bounds = pane->Window().bounds;
    Point const within = {at.x - bounds.x1, at.y - bounds.y1};
    if (!held) pane->Hover(within);
    ShowPointer(pane->PointerAt(within));
}

void Desktop::OnKey(GrEvent const& event)
{
    if (event.type == GrEventKeyDown && event.vk == 'q' && (event.modifiers & GrModControl)) isOver = true;
    if (event.type == GrEventKeyDown && event.vk == GrVkEscape) {
        bar->CloseMenu();
        Point at{};
        unsigned buttons = 0;
        GrGetCursorPos(at.x, at.y, buttons);
        PointAt(at);
    }
    if (active) active->Key(event);
}

Frame* Desktop::FrameOf(GrWindow const& window)
{
    for (auto const& frame : frames)
        if (&window == &frame->Window() || &window == &frame->Content().Window()) return frame.get();
    return nullptr;
}

void Desktop::Activate(Frame* frame)
{
    if (active && active != frame) active->SetActive(false);
    active = frame;
    if (!frame) return;
    frame->Window().Raise();
    frame->SetActive(true);
    bar->Window().Raise();
}

Frame* Desktop::TopFrame()
{
    for (GrWindow* window = GrWindow::RootWindow()->first; window; window = window->next)
        if (window->IsVisible())
            if (Frame* const frame = FrameOf(*window)) return frame;
    return nullptr;
}

void Desktop::Toggle(Frame& frame)
{
    if (frame.Window().IsVisible()) {
        frame.Window().Hide();
        Activate(TopFrame());
    } else {
        frame.Window().Show();
        Activate(&frame);
    }
}

}

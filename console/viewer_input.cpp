#include <console/viewer_input.h>

#include <bit>

namespace console {

namespace {

using std::chrono::milliseconds;

constexpr std::size_t kMostEvents = 1000;  // that wait for the program
constexpr milliseconds kReadLimit{100};    // what is not read for so long doesn't hold up others
constexpr milliseconds kOpenLimit{1000};   // the same for a mouse that the program gets ready
// Programs read the two devices side by side. A key behind a click is to come when that has had its effect.
constexpr milliseconds kChangePause{30};
constexpr std::chrono::microseconds kPoll{250};  // from one look at whether the program has read to the next
constexpr std::chrono::microseconds kIdlePoll{20000};

constexpr unsigned kLeftAlt = 56;

/// The console whose key this is when alt is held; 0 for other keys.
unsigned ConsoleOfKey(unsigned code)
{
    constexpr unsigned f1 = 59;
    constexpr unsigned f10 = 68;
    constexpr unsigned f11 = 87;
    constexpr unsigned f12 = 88;
    if (code >= f1 && code <= f10) return code - f1 + 1;
    return code == f11 || code == f12 ? code - f11 + 11 : 0;
}

}

void ViewerInput::Stop()
{
    if (!thread.joinable()) return;
    thread.request_stop();
    thread.join();
    std::lock_guard const lock(mutex);
    NoticeReading(KeyboardState(), MouseState());
}

void ViewerInput::Start()
{
    thread = std::jthread([this](std::stop_token const& stop) { Run(stop); });
}

void ViewerInput::Key(Hands& hands, unsigned char code, bool down)
{
    std::lock_guard const lock(mutex);
    if (down) {
        if (IsFull()) return;
        if (!hands.keys.test(code)) ++keyHolders.at(code);
        hands.keys.set(code);
        Add(KeyByte{code});
    } else if (hands.keys.test(code)) {
        hands.keys.reset(code);
        if (--keyHolders.at(code) == 0) Add(KeyByte{static_cast<unsigned char>(code | KeyByte::kReleased)});
    }
}

void ViewerInput::Point(Hands& hands, int x, int y, unsigned down)
{
    std::lock_guard const lock(mutex);
    if (!events.empty() && std::holds_alternative<Place>(events.back()))
        events.back() = Place{x, y};
    else if (!IsFull())
        Add(Place{x, y});
    for (unsigned bit = 0; bit < buttonHolders.size(); ++bit) {
        unsigned const mask = 1U << bit;
        bool const isDown = (down & mask) != 0;
        if (isDown == ((hands.buttons & mask) != 0) || (isDown && IsFull())) continue;
        hands.buttons ^= mask;
        auto& holders = buttonHolders[bit];
        bool const counts = isDown ? holders++ == 0 : --holders == 0;
        if (counts) Add(Button{mask, isDown});
    }
}

void ViewerInput::TurnWheel(int notch)
{
    std::lock_guard const lock(mutex);
    if (!IsFull()) Add(Notch{notch});
}

void ViewerInput::SwitchTo(unsigned toConsole)
{
    std::lock_guard const lock(mutex);
    if (!IsFull()) Add(ConsoleSwitch{toConsole});
}

void ViewerInput::LetGo(Hands& hands)
{
    for (unsigned code = 0; code < hands.keys.size(); ++code)
        Key(hands, static_cast<unsigned char>(code), false);
    std::lock_guard const lock(mutex);
    for (unsigned bit = 0; bit < buttonHolders.size(); ++bit)
        if ((hands.buttons >> bit & 1) != 0 && --buttonHolders[bit] == 0) Add(Button{1U << bit, false});
    hands.buttons = 0;
}

/// Releases come through nevertheless: there are no more of them than there are keys and buttons.
bool ViewerInput::IsFull() const { return events.size() >= kMostEvents; }

void ViewerInput::Add(Event const& event)
{
    events.push_back(event);
    hasNews = true;
    wake.notify_all();
}

void ViewerInput::Run(std::stop_token const& stop)
{
    std::unique_lock lock(mutex);
    while (!stop.stop_requested()) {
        bool const busy = Step();
        if (!busy && recording != nullptr) recording->OnIdle();
        hasNews = false;
        wake.wait_for(lock, stop, busy ? kPoll : kIdlePoll, [&] { return hasNews && !busy; });
    }
}

/// Brings a part of the first event that can be brought. False if there is none.
bool ViewerInput::Step()
{
    NoticeConsole();
    auto const keyboard = KeyboardState();
    auto const mouse = MouseState();
    NoticeReading(keyboard, mouse);
    if (unsigned const late = buttons & ~wantedButtons; late != 0 && !IsAway() && mouse == Device::Free) {
        // Let go while another console was shown.
        Report({0, 0, 0, buttons & ~std::bit_floor(late)});
        return true;
    }
    for (auto event = events.begin(); event != events.end(); ++event) {
        auto const state = StateFor(*event, keyboard, mouse);
        if (state == Device::Stuck) continue;
        if (state == Device::Free && std::visit([this](auto const& one) { return Do(one); }, *event))
            events.erase(event);
        return true;
    }
    return false;
}

void ViewerInput::NoticeConsole()
{
    int const shown = console.Tty().activeConsole;
    if (shown == shownConsole) return;
    if (recording != nullptr) recording->Add(ConsoleSwitch{static_cast<unsigned>(shown)});
    shownConsole = shown;
    if (!IsAway()) path.Forget();
}

void ViewerInput::NoticeReading(Device keyboard, Device mouse)
{
    if (!keyRecorded && !reportRecorded) return;
    keyRecorded = keyRecorded && keyboard != Device::Free;
    reportRecorded = reportRecorded && mouse != Device::Free;
    if (!keyRecorded && !reportRecorded) recording->OnRead();
}

/// True if the program has opened the mouse and said to it what it has to say.
bool ViewerInput::IsMouseOpen()
{
    if (unsigned const opens = console.Count(Request::OpenMouse); opens != mouseOpens) {
        mouseOpens = opens;
        mouseReady = false;
        mouseOpened = Clock::now();
        handshake = {};
        path.Forget();
    }
    mouseReady = mouseReady || handshake.IsOver(console);
    return mouseReady;
}

ViewerInput::Device ViewerInput::MouseState()
{
    auto const now = Clock::now();
    if (!IsMouseOpen())
        return mouseOpens != 0 && now - mouseOpened < kOpenLimit ? Device::Busy : Device::Stuck;
    if (console.IsMouseRead()) return Device::Free;
    return now - mouseReported < kReadLimit ? Device::Busy : Device::Stuck;
}

ViewerInput::Device ViewerInput::KeyboardState()
{
    if (console.AreKeysRead()) return Device::Free;
    return Clock::now() - keySent < kReadLimit ? Device::Busy : Device::Stuck;
}

ViewerInput::Device ViewerInput::StateFor(Event const& event, Device keyboard, Device mouse) const
{
    if (IsAway() || std::holds_alternative<ConsoleSwitch>(event)) return Device::Free;
    bool const isKey = std::holds_alternative<KeyByte>(event);
    auto const state = isKey ? keyboard : mouse;
    bool const tooSoon = Clock::now() - (isKey ? mouseReported : keySent) < kChangePause;
    return state == Device::Free && tooSoon ? Device::Busy : state;
}

bool ViewerInput::Do(KeyByte key)
{
    unsigned const code = key.code & ~KeyByte::kReleased;
    bool const down = (key.code & KeyByte::kReleased) == 0;
    keysDown.set(code, down);
    if (IsAway()) {
        unsigned const wished = down && keysDown.test(kLeftAlt) ? ConsoleOfKey(code) : 0;
        if (wished != 0) console.SwitchTo(wished);
        return true;
    }
    if (!console.TypeKeys({&key.code, 1})) return false;
    keySent = Clock::now();
    if (recording != nullptr) {
        recording->Add(key);
        keyRecorded = true;
    }
    return true;
}

bool ViewerInput::Do(Place place)
{
    if (IsAway()) return true;
    auto const mode = console.Mode();
    auto const motion =
        path.Next(static_cast<int>(mode.width), static_cast<int>(mode.height), place.x, place.y);
    if (!motion) return true;
    Report({motion->dx, motion->dy, 0, buttons});
    return false;
}

bool ViewerInput::Do(Button button)
{
    wantedButtons = button.down ? wantedButtons | button.bit : wantedButtons & ~button.bit;
    if (!IsAway()) Report({0, 0, 0, button.down ? buttons | button.bit : buttons & ~button.bit});
    return true;
}

bool ViewerInput::Do(Notch notch)
{
    if (!IsAway()) Report({0, 0, notch.turn, buttons});
    return true;
}

bool ViewerInput::Do(ConsoleSwitch to)
{
    console.SwitchTo(to.console);
    return true;
}

/// Only when the program has read all before, so that there is room.
void ViewerInput::Report(MouseReport const& report)
{
    console.MoveMouse(report.dx, report.dy, report.wheel, report.buttons);
    buttons = report.buttons;
    mouseReported = Clock::now();
    if (recording == nullptr) return;
    recording->Add(report);
    reportRecorded = true;
}

}

#include <common/bundle_api.h>
#include <file/file.h>
#include <support/layout_file.h>
#include <support/on_console.h>
#include <tessella.h>
#include <tessella/keyboard_device.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <map>
#include <random>
#include <sstream>
#include <thread>

#include <fcntl.h>
#include <sys/ioctl.h>

// The keyboard on the virtual console: bytes go in at the tty, events come out of the loop.

namespace {

using console::Request;
using Log = std::vector<std::string>;

timeval noWait{0, 0}, aWhile{0, 100};

std::string TextOf(GrEvent const& event)
{
    std::ostringstream text;
    text << std::hex << event.type << " vk " << event.vk << " chars";
    for (unsigned i = 0; i < event.charCount; ++i)
        text << ' ' << event.chars[i];
    text << " repeat " << +event.repeat << " modifiers " << event.modifiers << ' ' << event.time
         << event.window;
    return text.str();
}

constexpr unsigned kNone = GrKeyLayout::kNoDeadKey;

/// What bytes of the keyboard come to, by the layouts of a file that is read for itself.
struct Model {
    LayoutFile file;
    unsigned layout = 0, modifiers = 0, heldLocks = 0, chord = 0, dead = kNone, deadCharacter = 0;
    int consoles = 0, composed = 0;
    std::array<bool, 128> down{};
    Log log{};

    GrKeyLayout const& Layout() const { return *file.layouts->at(layout); }
    std::string Name() const { return {Layout().GetName(), Layout().GetName() + 2}; }
    unsigned Leds() const { return (modifiers & 4) | (modifiers >> 5 & 2) | (modifiers >> 7 & 1); }

    void Type(unsigned char byte)
    {
        if (byte == 0) return;
        bool const pressed = byte < 128;
        unsigned short character = 0;
        GrEvent event;
        event.type = pressed ? 512 : 513;
        event.repeat = pressed && down[byte & 127];
        down[byte & 127] = pressed;
        event.modifiers = modifiers;
        event.vk = Layout().Translate(byte & 127, event.modifiers, &character);
        event.chars[0] = character;
        event.charCount = character != 0;
        if (pressed && character != 0) Compose(event, character);
        Act(event.vk, pressed);
        if (event.vk != 0) log.push_back(TextOf(event));
    }

    void Compose(GrEvent& event, unsigned character)
    {
        if (dead == kNone) {
            dead = Layout().FindDeadKey(character);
            if (dead != kNone) event.chars[0] = 0, deadCharacter = character;
            return;
        }
        unsigned result = character;
        bool const pair = Layout().ApplyDeadKey(std::exchange(dead, kNone), result);
        event.charCount = pair || character == ' ' ? 1 : 2;
        event.chars[0] = pair ? result : deadCharacter;
        event.chars[1] = character;
        composed += pair;
    }

    void Act(unsigned vk, bool pressed)
    {
        static std::map<unsigned, unsigned> const kHeld = {
            {0xFFE1, 1}, {0xFFE2, 3}, {0xFFE3, 8}, {0xFFE4, 8}, {0xFFE9, 0x10}, {0xFFEA, 0x30}};
        static std::map<unsigned, unsigned> const kLocks = {
            {0xFFE5, 4}, {0xFF63, 0x800}, {0xFF7F, 0x40}, {0xFF14, 0x80}};
        unsigned const held = kHeld.contains(vk) ? kHeld.at(vk) : 0, chordKey = held & 9;
        unsigned const lock = kLocks.contains(vk) ? kLocks.at(vk) : 0;
        modifiers = (pressed ? modifiers | held : modifiers & ~held) ^ (pressed ? lock & ~heldLocks : 0);
        heldLocks = pressed ? heldLocks | lock : heldLocks & ~lock;
        if (chordKey != 0 && !pressed && (chord & ~chordKey) && file.layouts->size() > 1) {
            layout = (layout + 1) % file.layouts->size();
            log.push_back(Name());
        }
        chord = chordKey == 0 ? 0 : pressed ? chord | chordKey : chord & ~chordKey;
        if ((modifiers & 8) && (modifiers & 0x11) && vk >= 0xFFBE && vk <= 0xFFC7) ++consoles;
    }
};

Log seen;

/// Starts a session in a language, with nothing due.
void Start(char const* language)
{
    BundleApi::SetLanguage(language);
    Sizes sizes;
    ASSERT_TRUE(Init(sizes));
    GrWindow::SetCallback([](GrEvent const& event) {
        if (event.type == GrEventLayoutChanged) seen.emplace_back(event.layoutName, event.layoutName + 2);
    });
    GrEvent event;
    while (GrGetEvent(event, &noWait)) {
    }
}

/// Types the bytes, as many at a time as are surely held, and compares what comes out with the model.
void Type(console::VirtualConsole& screen, Model& model, Bytes const& bytes)
{
    for (std::size_t from = 0; from < bytes.size() && !testing::Test::HasFailure(); from += 100) {
        Bytes some(bytes.begin() + from, bytes.begin() + std::min(from + 100, bytes.size()));
        some.insert(some.end(), {87, 87 | 128});  // what gives no event is taken before what gives one
        model.log.clear();
        seen.clear();
        for (auto const byte : some)
            model.Type(byte);
        ASSERT_TRUE(screen.TypeKeys(some));
        auto const limit = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        while (seen.size() < model.log.size() && std::chrono::steady_clock::now() < limit) {
            GrEvent event;
            event.vk = event.time = 9;  // of an earlier event
            event.window = GrWindow::RootWindow();
            if (GrGetEvent(event, &aWhile)) seen.push_back(TextOf(event));
        }
        ASSERT_EQ(seen, model.log) << "typed: " << testing::PrintToString(some);
        ASSERT_EQ(screen.Tty().leds, model.Leds());
        ASSERT_EQ(sessionKeyboard->GetModifiers(), model.modifiers);
        ASSERT_EQ(int(screen.Count(Request::ActivateConsole)), model.consoles);
        char16_t const* const name = GrGetKeyboardLayout();
        ASSERT_EQ(
            name ? std::string(name, name + 2) : "", model.file.layouts->size() > 1 ? model.Name() : "");
    }
}

/// A key, with others held meanwhile.
Bytes Stroke(Bytes bytes, unsigned char key)
{
    auto const held = bytes.size();
    bytes.insert(bytes.end(), {key, static_cast<unsigned char>(key | 128)});
    for (std::size_t i = 0; i < held; ++i)
        bytes.push_back(bytes[i] | 128);
    return bytes;
}

Bytes operator+(Bytes a, Bytes const& b)
{
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

/// How the layout types a character.
Bytes StrokeFor(GrKeyLayout const& layout, unsigned character)
{
    std::map<unsigned, Bytes> const levels = {{0, {}}, {1, {42}}, {0x30, {100}}, {0x31, {100, 42}}};
    for (auto const& [modifiers, held] : levels)
        for (unsigned char key = 1; key < 128; ++key) {
            unsigned flags = modifiers;
            unsigned short typed = 0;
            if (layout.Translate(key, flags, &typed) != 0 && typed == character) return Stroke(held, key);
        }
    ADD_FAILURE() << "no key for " << character;
    return {};
}

/// All dead keys with what can follow them, and how many pairs these are.
Bytes EveryDeadKey(GrKeyLayout const& layout, int& pairs)
{
    Bytes bytes;
    for (unsigned character = 1; character < 0x300; ++character) {
        unsigned const index = layout.FindDeadKey(character);
        if (index == kNone) continue;
        Bytes const dead = StrokeFor(layout, character);
        bytes = bytes + dead + Stroke({}, 57) + dead + dead;
        for (unsigned letter = 1, result = 1; letter < 0x300; result = ++letter)
            if (layout.ApplyDeadKey(index, result)) ++pairs, bytes = bytes + dead + StrokeFor(layout, letter);
    }
    return bytes;
}

Bytes EveryKeyAtEachLevel()
{
    Bytes bytes;
    for (unsigned char const lock : {58, 69, 58, 69}) {
        bytes = bytes + Stroke({}, lock);
        for (Bytes const& held : {Bytes{}, Bytes{42}, Bytes{54}, Bytes{100}, Bytes{100, 42}, Bytes{29, 56}})
            for (unsigned char key = 1; key < 128; ++key)
                if (!std::ranges::count(Bytes{29, 42, 54, 56, 58, 69, 70, 97, 100, 110, 68}, key) &&
                    !(key == 50 && held == Bytes{29, 56}))  // and none that makes keys move the pointer
                    bytes = bytes + Stroke(held, key);
    }
    return bytes;
}

TEST(Keyboard, EveryKeyOfEveryLayoutTypesWhatItsFileSays)
{
    for (std::string const language : {"C", "cs", "de", "es_ES", "fr", "it", "nl", "pl", "pt", "pt_BR", "ru"})
        OnConsole("64x48x8", nullptr, [&](console::VirtualConsole& screen) {
            SCOPED_TRACE(language);
            screen.SetFault(Request::ActivateConsole, EIO);  // asked for, and not left
            Start(language.c_str());
            std::string const folder = language == "C" ? "" : language + '/';
            Model model{LayoutFile(ReadBytes(RESOURCES + folder + "keyboard.kbd"))};
            for (std::size_t i = 0; i < model.file.layouts->size(); ++i) {
                int pairs = model.composed = 0;
                Type(screen, model, EveryDeadKey(model.Layout(), pairs));
                EXPECT_EQ(model.composed, pairs);
                Type(screen, model, EveryKeyAtEachLevel() + Stroke({29}, 42));  // then the next layout
            }
            std::mt19937 random(7);
            Bytes bytes(3000);
            Bytes const often = {29, 42, 54, 56, 100, 58, 110, 13};  // with an effect, and a dead one
            for (auto& byte : bytes)
                do
                    byte = random() % 2 ? random() : often[random() % often.size()] | (random() % 2 << 7);
                while (std::ranges::count(
                    Bytes{50, 68, 69}, byte & 127));  // they may make keys move the pointer
            Type(screen, model, bytes);
            GrDone();
        });
}

/// The modes of keyboard, screen and switching, and the terminal's.
std::string ModesOf(console::VirtualConsole& screen)
{
    auto const tty = screen.Tty();
    auto const terminal = screen.Terminal();
    std::ostringstream text;
    text << tty.keyboardMode << ' ' << tty.consoleMode << ' ' << +tty.vtMode.mode << std::hex;
    for (auto const mode : {terminal.c_iflag, terminal.c_oflag, terminal.c_cflag, terminal.c_lflag})
        text << ' ' << mode;
    text << ' ' << +terminal.c_cc[VMIN] << +terminal.c_cc[VTIME];
    return text.str();
}

TEST(Keyboard, TakesWhatItCanOfTheConsoleAndGivesThatBack)
{
    constexpr Request kNothing = Request::GetVtState;  // the library never asks
    struct Case {
        Request fault;
        std::string during, after;
    };
    std::string const found = "3 0 0", taken = "2 1 1", raw = " 5 0 bd 0 10";
    for (bool const exits : {false, true})
        for (auto const& c : {Case{kNothing, taken, found}, Case{Request::OpenTty, found, found},
                 Case{Request::GetKeyboardMode, taken, "2 0 0"},
                 Case{Request::SetKeyboardMode, "3 1 1", found},
                 Case{Request::GetConsoleMode, "2 0 1", found}, Case{Request::GetVtMode, taken, found},
                 Case{Request::SetVtMode, "2 1 0", found}, Case{Request::GetFixedInfo, taken, taken}})
            OnConsole("64x48x8", nullptr, [&](console::VirtualConsole& screen) {
                ioctl(open("/dev/tty0", O_RDWR), KDSKBLED, LED_NUM);
                std::string const cooked = ModesOf(screen).substr(found.size());
                bool const opens = c.fault != Request::OpenTty, starts = c.fault != Request::GetFixedInfo;
                screen.SetPathFault("/dev/tty0", ENOENT);
                screen.SetFault(c.fault, EIO);
                auto const outcome = RunChild([&] {
                    EXPECT_FALSE(SwitchToConsole(2) || GrGetKeyboardLayout());
                    EXPECT_EQ(GrFindVkForChar('a'), 0xFFFFFFFF);
                    BundleApi::SetLanguage("de");
                    Sizes sizes;
                    EXPECT_EQ(Init(sizes), starts);
                    EXPECT_EQ(ModesOf(screen), c.during + (opens ? raw : cooked));
                    EXPECT_EQ(sessionKeyboard->GetModifiers(), opens ? GrModNumLock : 0u);
                    EXPECT_EQ(GrFindVkForChar(0xFC), opens ? +GrVkLeftBracket : 0u);
                    EXPECT_EQ(screen.Count(Request::SetLeds), opens ? 2u : 1u) << "one is this test's";
                    EXPECT_EQ(SwitchToConsole(63), opens);
                    EXPECT_FALSE(SwitchToConsole(64));
                    EXPECT_EQ(screen.Tty().activeConsole, opens && c.fault != Request::SetVtMode ? 63 : 1);
                    screen.TypeKeys(Bytes{0, 50});
                    GrEvent event;
                    EXPECT_FALSE(!opens && sessionKeyboard->HasKey());
                    for (bool moved = false; starts && opens && !(moved && event.vk == 'M');) {
                        if (!GrGetEvent(event, nullptr) || event.type != GrEventMouseMove) continue;
                        EXPECT_EQ(event.modifiers, GrModNumLock) << "of the pointer, too";
                        moved = true;
                    }
                    if (exits) std::exit(testing::Test::HasFailure());
                    GrDone();
                    return testing::Test::HasFailure() ? 1 : 0;
                });
                EXPECT_EQ(outcome.status, 0) << outcome.out;
                EXPECT_EQ(outcome.err.find("TESSELLA: Filed to open a tty\n"), opens ? std::string::npos : 0);
                bool const stays = exits || !starts;
                EXPECT_EQ(ModesOf(screen), (stays ? c.during : c.after) + (stays && opens ? raw : cooked));
                EXPECT_EQ(screen.Tty().leds, 2u);
            });
}

TEST(Keyboard, AStormOfKeysIsDeliveredInOrderOrRefusedWithABeep)
{
    char const* const wish = std::getenv("TESSELLA_STORM");
    int const count = wish ? std::atoi(wish) : 50'000;
    OnConsole("64x48x8", nullptr, [&](console::VirtualConsole& screen) {
        Start("C");
        auto const beeps = [] { return std::ranges::count(ReadAll(STDOUT_FILENO), '\a'); };
        screen.TypeKeys(Bytes(128, 30));
        while (beeps() == 0)
            std::this_thread::yield();
        GrEvent event;
        for (int i = 0; i < 127; ++i)
            EXPECT_TRUE(GrGetEvent(event, &noWait));
        EXPECT_FALSE(GrHasEvent()) << "one was too many";

        std::thread typist([&] {
            for (int i = 0; i < count; ++i)
                while (!screen.TypeKeys(Bytes{static_cast<unsigned char>(i % 12 + 2)}))
                    std::this_thread::yield();
        });
        int next = 0, delivered = 0;
        for (auto refused = beeps() - 1; delivered + refused < count;) {
            if (!GrGetEvent(event, &aWhile)) {
                refused = beeps() - 1;
                continue;
            }
            while (next < count && unsigned("1234567890-="[next % 12]) != event.vk)
                ++next;
            ++next;
            if (++delivered % 5000 == 0) std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        typist.join();
        EXPECT_LE(next, count) << "not in the order in which they were typed";
        EXPECT_EQ(delivered + beeps() - 1, count);
        GrDone();
    });
}

/// A file that says it has so many bytes, and has others, all of them 0.
struct LayoutStream final : si_file {
    LayoutStream(unsigned told, unsigned real) : size(told), there(real) {}
    void Read(void* buffer, std::uint64_t, std::uint64_t& count) override
    {
        std::fill_n(static_cast<char*>(buffer), count = there, 0);
    }
    void Rewind() override {}
    std::uint64_t Size() override { return size; }
    unsigned const size, there;
};

TEST(Keyboard, RefusesLayoutFilesThatFallShort)
{
    struct : GrSmartKeyboard {
        unsigned GetLeds() override { return 0; }
        void SetLeds(unsigned) override {}
        bool HasKey() override { return false; }
        void GetKey(GrEvent&) override {}
    } keyboard;
    for (auto const& [size, there] : {std::pair{2331u, 2331u}, {2332, 2331}, {0, 0}, {2332, 2332}}) {
        LayoutStream stream(size, there);
        EXPECT_EQ(keyboard.LoadLayoutStream(&stream), there == 2332);
    }
    EXPECT_FALSE(keyboard.LoadLayoutStream(nullptr) || keyboard.LoadLayouts("none.kbd"));
}

}

// What the user does: typed text, where the pointer is, and how far a thread has come with its work. Escape
// ends.
#include <tessella.h>

#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <memory>
#include <string>
#include <thread>

namespace {

GrFont* font = nullptr;
std::u16string typed;
std::string said = "Type something, or click.";
int done = 0;  // percent
std::atomic<bool> ending = false, workEnded = false;

void Paint(GrEvent const& event)
{
    GrContext& context = *event.window->GetContext();
    context.SetForeColor(GrMakeColor(244, 240, 228));
    context.FillRegion(event.rect);
    context.SetForeColor(GrMakeColor(32, 40, 64));
    context.DrawText(20, 40, reinterpret_cast<unsigned char const*>(said.data()),
        static_cast<unsigned>(said.size()), font, true);
    context.DrawTextW(20, 70, reinterpret_cast<unsigned short const*>(typed.data()),
        static_cast<unsigned>(typed.size()), font, true);
    context.FillRegion(GrRect{20, 90, 20 + done * 2, 100});
    event.window->FreeContext(&context);
}

/// A key's characters are what it types; its virtual key code tells which key it is.
void OnKey(GrEvent const& event)
{
    if (event.vk == GrVkBackspace) {
        if (!typed.empty()) typed.pop_back();
        return;
    }
    for (unsigned i = 0; i < event.charCount; ++i)
        if (event.chars[i] >= ' ') typed += static_cast<char16_t>(event.chars[i]);
}

void OnMouse(GrEvent const& event)
{
    said = "The pointer is at " + std::to_string(event.x) + ", " + std::to_string(event.y) + ".";
    if (event.type == GrEventLeftDown) said += " Click!";
    if (event.type == GrEventWheelUp) said += " Up!";
    if (event.type == GrEventWheelDown) said += " Down!";
}

/// Another thread may use the library between grabbing and ungrabbing the input, which wakes the loop, too.
/// The signal by which the kernel asks for another console is not for it.
void Work()
{
    sigset_t switches;
    sigemptyset(&switches);
    sigaddset(&switches, SIGUSR2);
    pthread_sigmask(SIG_BLOCK, &switches, nullptr);
    for (int percent = 10; percent <= 100 && !ending; percent += 10) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        GrGrabInput();
        done = percent;
        GrWindow::RootWindow()->Invalidate(GrRect{20, 90, 220, 100});
        GrUngrabInput(true);
    }
    workEnded = true;
    GrUnfreeze();
}

/// Until Escape is pressed, and then for as long as the thread may need the library: it gets it only while
/// this loop waits.
void HandleEvents()
{
    for (GrEvent event; !ending || !workEnded;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) {
            Paint(event);
        } else if (event.type == GrEventKeyDown && event.vk == GrVkEscape) {
            ending = true;
        } else if (event.type != GrEventKeyUp) {
            event.type == GrEventKeyDown ? OnKey(event) : OnMouse(event);
            GrWindow::RootWindow()->Invalidate();
        }
    }
}

}

int main()
{
    unsigned width, height, depth;
    if (!GrInit(width, height, depth, 0)) {
        std::fputs("There is no screen to draw on; tessella-doctor tells why.\n", stderr);
        return 1;
    }
    {
        std::unique_ptr<GrFont> const created(GrFont::Create("helvetica", 140, false, 400, false, false));
        font = created.get();
        std::thread worker(Work);
        HandleEvents();
        worker.join();
    }
    GrDone();
}

#pragma once

#include "contents.h"
#include "frame.h"
#include "menu.h"

#include <memory>
#include <vector>

namespace desktop {

/// Everything on the screen, and who gets which event.
class Desktop {
public:
    Desktop();
    ~Desktop();
    Desktop(Desktop const&) = delete;
    Desktop& operator=(Desktop const&) = delete;

    /// Until the user leaves.
    void Run();

    /// What windows are told in the midst of operations.
    void OnWindowEvent(GrEvent const& event);
    void OnLanguage();

private:
    template <typename Content>
    void AddFrame(Word title, GrRect const& place);
    void FillBar();
    void Paint(GrEvent const& event);
    void OnMouse(GrEvent const& event);
    void OnKey(GrEvent const& event);
    void PointAt(Point at);

    Frame* FrameOf(GrWindow const& window);
    void Activate(Frame* frame);
    /// The topmost frame that is shown, or null.
    Frame* TopFrame();
    void Toggle(Frame& frame);

    std::unique_ptr<GrImage> wallpaper;
    std::vector<std::unique_ptr<Frame>> frames;
    Note* note = nullptr;  // in one of them
    std::unique_ptr<Hexagon> hexagon;
    std::unique_ptr<Bar> bar;

    Frame* active = nullptr;
    Pane* held = nullptr;     // has the pointer while the button is down
    Pane* pointed = nullptr;  // the pointer is over it
    bool isOver = false;
};

}

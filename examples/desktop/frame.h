#pragma once

#include "pane.h"
#include "words.h"

#include <memory>

namespace desktop {

/// A window with a title, which is where one takes it, and a button that hides it. It lies on the root, casts
/// a shadow, and holds another pane.
class Frame : public Pane {
public:
    /// `place` is what the content gets.
    Frame(GrRect const& content, Word title);

    template <typename Content>
    void Hold()
    {
        content = std::make_unique<Content>(window, Inside());
        content->Window().Show();
    }
    Pane& Content() { return *content; }
    Word Title() const { return title; }

    /// One frame is active: it gets the keys.
    void SetActive(bool nowActive);

    void Paint(GrContext& context) override;
    void Press(Point at) override;
    void Drag(Point at) override;
    void Release(Point at) override;
    void Hover(Point at) override;
    void Leave() override { SetButtonLit(false); }
    void Key(GrEvent const& event) override { content->Key(event); }
    Pointer PointerAt(Point at) const override;

private:
    GrRect Inside() const;
    GrRect Button() const;
    void SetButtonLit(bool lit);

    std::unique_ptr<Pane> content;
    Word const title;
    bool active = false, buttonLit = false, buttonHeld = false, dragged = false;
    Point grip{};  // where on the window the pointer holds it
};

}

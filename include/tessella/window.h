#pragma once

#include <tessella/event.h>
#include <tessella/export.h>
#include <tessella/region.h>
#include <tessella/types.h>

#include <cstdint>

class GrContext;

/// Flags of a `GrWindow`.
enum : std::uint32_t {
    GrWindowVisible = 1,      ///< shown; what can be seen of it depends on the windows above and around it
    GrWindowInvalidated = 4,  ///< all of it and of its subtree is known to be due for paint
    GrWindowShadowed = 8      ///< casts a shadow
};

/// A shaped area of the screen in a tree of such areas. Windows hold no pixels. They tell which pixels belong
/// to whom, keep the record of what on the screen is up to date, and hand out contexts that are clipped to
/// what is seen of a window.
///
/// The application derives nothing from it: what windows do is up to one callback, which receives `GrEvent`
/// records. It runs on the calling thread, in the midst of the operations that say so.
///
/// Among siblings, earlier in the list means closer to the viewer. A window is seen within its parent only,
/// and on its parent's shadow; a parent's pixels are those that its children leave. Coordinates are screen
/// coordinates, also those of children, except where an operation says *window coordinates*: they count from
/// `bounds.x1`, `bounds.y1`.
///
/// Nothing is painted at once. What a change uncovers or alters is *invalid*, and `GrGetEvent` hands it out
/// as paint events, from the top of the screen downward, one a window.
///
/// All operations belong to the application's thread during a session, or to a thread between `GrGrabInput`
/// and `GrUngrabInput`. Wrong use is reported as a failed assertion, and the operation goes on as far as that
/// is safe. If memory runs out, `std::bad_alloc` leaves the operation.
class GR_API GrWindow {
public:
    void* userData = nullptr;    ///< the application's
    GrRect bounds{};             ///< the outer rectangle
    GrRegion region;             ///< the exact shape
    GrRegion* shadow = nullptr;  ///< the shape of the shadow; null without one; owned by the window

    /// The context that `GetContext` gives while the library has the window paint off screen, into the image
    /// of a shadow; else null.
    GrContext* context = nullptr;
    GrRegion reservedRegion;     ///< always empty
    std::uint32_t flags = 0;     ///< `GrWindowVisible` and the others
    GrWindow* parent = nullptr;  ///< null for the root only
    GrWindow* first = nullptr;   ///< the topmost child
    GrWindow* last = nullptr;    ///< the bottommost child
    GrWindow* prev = nullptr;    ///< the sibling above
    GrWindow* next = nullptr;    ///< the sibling below

    /// For the session: makes the root as large as the screen, and visible.
    static void InitWindows();
    /// For the session: hides the root, and forgets the callback and what is valid.
    static void ShutdownWindows();
    /// For the session, after a change of mode: all of the screen is due for paint. If the size is another
    /// one, the root takes it and is announced as changed.
    static void OnVideoModeChanged();

    /// The root: the whole screen below all windows. It belongs to the library, has no parent and is painted
    /// by the application like any other window.
    static GrWindow* RootWindow();
    /// Sets the receiver of events, before the first window is made. It stays until the session ends. When a
    /// change of mode announces the root as changed, the screen is held: the receiver must not ask for input
    /// or the pointer then.
    static void SetCallback(void (*callback)(GrEvent const&));
    /// The window that a point belongs to, counting shadows as parts of their windows if `withShadow`. The
    /// root where there is no other, null off the screen. What sticks out of a parent is not found.
    static GrWindow* WindowAtXY(int x, int y, bool withShadow);

    /// Finds the next area that is due for paint and takes it for valid from now on, so the caller paints it.
    /// Shadows in it are painted at once, which runs the callback.
    /// `event` becomes a paint event. With null, only tells whether anything is due. False if nothing is, or
    /// while the console shows somebody else's screen.
    static bool GetPaintEvent(GrEvent* event);
    /// The same, looking only within `area` (screen coordinates), a part of the screen without gaps between
    /// its rows. It becomes the area that the event's rectangle encloses; with `event` null, all that is due
    /// there.
    static bool GetPaintEvent(GrEvent* event, GrRegion& area);

    /// A hidden window at the top of its parent's children. A negative width or height counts as 0. The
    /// callback gets `GrEventWindowCreated` and `GrEventWindowChanged`, within the constructor. The parent
    /// must outlive the window.
    GrWindow(GrWindow* parent, int x, int y, int width, int height, void* userData);
    GrWindow(GrWindow const&) = delete;
    GrWindow& operator=(GrWindow const&) = delete;
    /// Tells the callback first (`GrEventWindowDestroyed`). There must be no children left; those that are
    /// left stand without a parent afterwards and can only be destroyed, or get another one.
    ~GrWindow();

    /// Links the window in as the topmost child of `parent`, without invalidating anything. It must not be
    /// linked in. A tool for `SetParent` and the constructor.
    void InsertToParent();
    /// Takes the window out of its parent's list, without invalidating anything; `parent` stays set.
    void RemoveFromParent();
    /// Makes the window the topmost child of `newParent`, which must not be the window itself or below it.
    /// Invalidates nothing and moves nothing: the caller invalidates the window before and, with `force`,
    /// after. Not for the root.
    void SetParent(GrWindow* newParent);

    /// Puts the window on top of its siblings. What it gains is due for paint.
    void Raise();
    /// Puts the window below all its siblings. What it loses is due for paint by those that it uncovers.
    /// Shadows do not count here: what they uncover stays as it is until something else has it painted.
    void Lower();

    /// Makes the window visible and all of it due for paint, and tells the callback (`GrEventWindowShown`).
    /// Nothing if it is.
    void Show();
    /// Makes the window invisible, and with it the whole subtree; tells the callback (`GrEventWindowHidden`).
    /// Nothing if it is invisible.
    void Hide();
    /// True if the window itself is shown; whether its ancestors are does not count.
    bool IsVisible() const { return (flags & GrWindowVisible) != 0; }

    /// Moves the window and its subtree so that its corner is at `x`, `y` (screen coordinates), and tells the
    /// callback (`GrEventWindowChanged`). Old and new place are due for paint. Not for the root.
    void Move(int x, int y);
    /// Moves the window and its subtree by an offset, without invalidating anything. Not for the root.
    void DoMove(int dx, int dy);

    /// Gives the window a shape, in window coordinates, and tells the callback (`GrEventWindowChanged`). A
    /// shape that does not begin at 0, 0 moves the window's corner, and window coordinates with it; an empty
    /// one puts it to the screen's corner. Nothing on the root.
    void SetWindowRegion(GrRegion const& shape);

    /// Has the window cast a shadow, 5 pixels to the right and downward, or not; nothing if it is so already.
    /// What this changes is due for paint. The shadow goes where the window goes and has its shape; it lies
    /// beyond the window, within the parent, and input passes through it. On the root it means nothing.
    ///
    /// The library paints shadows itself, whenever paint is asked for: it has the windows below paint off
    /// screen, through the callback, darkens that and copies it to the screen. Such paint events are like any
    /// other, except that `GetContext` gives a context over an image, which goes when the receiver has
    /// returned. The receiver must not destroy any window nor ask for paint meanwhile, and finds colours,
    /// pattern and raster mode of the context as others have left them. A window with nothing but a shadow to
    /// paint still gets its event, with an empty rectangle.
    void SetShadowed(bool shadowed);
    /// Paints `area` (screen coordinates), a part of the shadow on the screen without gaps between its rows.
    /// What it was is lost: it holds what did not lie to the right of the bounds, nor below them. A tool for
    /// the library, which calls it when paint is asked for.
    void DrawShadow(GrRegion& area);

    /// Writes the pixels of this window that nothing covers into `out`. Of its children, those above `stop`
    /// count as covering; with null, all. `fromValid` limits the result to what is valid; `withShadow` counts
    /// shadows in, the window's own as well as covering ones.
    void DoGetClipRegion(GrRegion& out, GrWindow const* stop, bool fromValid, bool withShadow);

    /// A context with its origin at the window's corner, clipped to what is seen now of the window and of its
    /// own shadow: a window with a shadow keeps to its `region` by itself. Later changes of
    /// the tree do not reach the context. Returned through `FreeContext`. It draws in the mode that it was
    /// made in, and must not be used in another. Null before the first session.
    GrContext* GetContext();
    /// The same with the area of the children included, and of all shadows, which do not count here. Never a
    /// context over an image: what is drawn goes to the screen. Returned through `FreeContext`.
    GrContext* GetNonclipContext();
    /// Takes back a context of this window; null is allowed.
    void FreeContext(GrContext* freed) const;

    /// True if the window is known to be due for paint as a whole, with its subtree.
    bool IsInvalidated() const;
    /// Makes all that is seen of the window due for paint, except its children.
    void Invalidate();
    /// The same for a part, in window coordinates.
    void Invalidate(GrRect const& rect);
    /// Makes all that is seen of the window and its subtree due for paint. Repeated, it costs next to
    /// nothing, unless `force` has it look again in any case.
    void FullInvalidate(bool force);
    /// Forgets that the window, and its subtree, are due as a whole.
    void ResetInvalidated();

    /// Hands all paint that is due, anywhere on the screen, to the callback now. The argument changes
    /// nothing: who wants an area painted invalidates it first.
    void Repaint(GrRegion const& area);

protected:
    /// The root.
    GrWindow() = default;
};

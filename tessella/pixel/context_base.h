#pragma once

#include <tessella/context.h>

/// The clip, origin and pattern operations, alike for contexts over images and over the screen. `State`
/// derives from the context's interface and declares the fields, in its own order.
template <typename State>
class GrContextBase : public State {
public:
    void SetClipRegion(GrRegion const& region) override;
    void GetClipRegion(GrRegion& region) override;
    void ExcludeClipRect(GrRect const& rect) override;
    void ExcludeClipRegion(GrRegion const& region) override;
    void ResetClipRegion() override;
    void SetOrigin(int x, int y) override;
    void GetOrigin(int& x, int& y) override;
    void SetPattern(std::uint8_t const bits[8], int dx, int dy, bool transparent) override;

protected:
    using State::State;
};

#include <tessella/pixel/context_base.inl>

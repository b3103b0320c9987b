#include <tessella/coordinates.h>
#include <tessella/region_cut.h>

#include <bit>

template <typename State>
void GrContextBase<State>::SetClipRegion(GrRegion const& region)
{
    LocalRegion const moved;
    moved.Get() = region;
    moved.Get().Offset(this->originX, this->originY);
    CutRegion(this->clip, moved.Get(), this->limit);
}

template <typename State>
void GrContextBase<State>::GetClipRegion(GrRegion& region)
{
    region = this->clip;
    region.Offset(SeenFrom(0, this->originX), SeenFrom(0, this->originY));
}

template <typename State>
void GrContextBase<State>::ExcludeClipRect(GrRect const& rect)
{
    this->clip -= Moved(rect, this->originX, this->originY);
}

template <typename State>
void GrContextBase<State>::ExcludeClipRegion(GrRegion const& region)
{
    GrRegion excluded(region);
    excluded.Offset(this->originX, this->originY);
    this->clip -= excluded;
}

template <typename State>
void GrContextBase<State>::ResetClipRegion()
{
    this->clip = this->limit;
}

template <typename State>
void GrContextBase<State>::SetOrigin(int x, int y)
{
    this->originX = Moved(this->baseOriginX, x);
    this->originY = Moved(this->baseOriginY, y);
}

template <typename State>
void GrContextBase<State>::GetOrigin(int& x, int& y)
{
    x = SeenFrom(this->originX, this->baseOriginX);
    y = SeenFrom(this->originY, this->baseOriginY);
}

template <typename State>
void GrContextBase<State>::SetPattern(std::uint8_t const bits[8], int dx, int dy, bool transparent)
{
    unsigned const down = static_cast<unsigned>(dy);
    for (unsigned i = 0; i < 8; ++i)
        this->pattern[i] = std::rotl(bits[(i - down) & 7], dx & 7);
    this->patternTransparent = transparent;
}

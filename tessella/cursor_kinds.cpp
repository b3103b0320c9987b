#include <tessella/cursor.h>

namespace {

class GrMaskedCursor : public GrCursor {
public:
    GrMaskedCursor(GrImage* shape, GrBitmap* shapeMask, int hotSpotX, int hotSpotY)
        : GrCursor(shape, shapeMask, hotSpotX, hotSpotY)
    {}
    ~GrMaskedCursor() override { Retire(); }
    void DrawShape(GrContext* target, GrRect const& where, int sx, int sy) override
    {
        target->DrawImageMaskedDirect(where, *image, *mask, sx, sy);
    }
};

class GrAlphaCursor : public GrCursor {
public:
    GrAlphaCursor(GrImage* shape, int hotSpotX, int hotSpotY) : GrCursor(shape, nullptr, hotSpotX, hotSpotY)
    {}
    ~GrAlphaCursor() override { Retire(); }
    void DrawShape(GrContext* target, GrRect const& where, int sx, int sy) override
    {
        static constexpr GrBlendParams kOverScreen{true, false, false, 0};
        target->DrawImageAlphaDirect(where, image.get(), sx, sy, kOverScreen);
    }
};

}

GrCursor* GrCursor::CreateInstance(GrImage* image, GrBitmap* mask, int hotX, int hotY)
{
    if (!mask) return new GrAlphaCursor(image, hotX, hotY);
    return new GrMaskedCursor(image, mask, hotX, hotY);
}

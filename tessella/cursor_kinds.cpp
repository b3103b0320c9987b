#include <tessella/cursor_kinds.h>

#include <tessella/screen.h>

namespace {

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

void GrMaskedCursor::DrawShape(GrContext* target, GrRect const& where, int sx, int sy)
{
    target->DrawImageMaskedDirect(where, *image, *mask, sx, sy);
}

GrCursor* GrCursor::CreateInstance(GrImage* image, GrBitmap* mask, int hotX, int hotY)
{
    if (!mask) return new GrAlphaCursor(image, hotX, hotY);
    if (GrScreen.depth < 5) return new GrMaskedCursor4(image, mask, hotX, hotY);
    return new GrMaskedCursor(image, mask, hotX, hotY);
}

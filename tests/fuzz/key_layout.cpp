#include <tessella/key_layout.h>

/// Everything that a keyboard may ask the layouts of a file.
extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* bytes, std::size_t size)
{
    std::vector<unsigned char> const file(bytes, bytes + size);  // aligned, and no byte more
    auto const layouts = ReadKeyLayouts(file);
    for (std::size_t i = 0; layouts && i < layouts->size() && i < 4; ++i) {
        auto const& layout = *(*layouts)[i];
        for (auto const* name = layout.GetName(); *name != 0; ++name) {
        }
        for (unsigned scan = 0; scan <= GrKeyLayoutRecord::kRowCount; ++scan) {
            for (unsigned all = 0; all < 128; ++all) {
                unsigned modifiers = all;
                unsigned short character = 0;
                layout.Translate(scan, modifiers, &character);
                unsigned composed = character;
                layout.ApplyDeadKey(layout.FindDeadKey(character), composed);
            }
        }
        unsigned missing = 0x10000 | layout.FindVkForChar(0x10000);
        for (unsigned index = 0; index <= GrKeyLayoutRecord::kMostDeadKeys; ++index)
            layout.ApplyDeadKey(index, missing);
    }
    return 0;
}

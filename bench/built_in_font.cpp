#include <bench/rows.h>
#include <tessella.h>

#include <benchmark/benchmark.h>
#include <cstdio>
#include <iterator>
#include <malloc.h>
#include <memory>
#include <string>
#include <zip.h>

// The built-in font as an application gets it: what it costs to have it, and to measure with it.

namespace {

std::unique_ptr<GrFont> NewFont()
{
    return std::unique_ptr<GrFont>(GrFont::Create("", 140, false, 400, false, false));
}

/// The font's file, inflated and nothing more.
std::string ReadFile()
{
    zip_t* const zip = zip_open(ARCHIVE, ZIP_RDONLY, nullptr);
    zip_stat_t status;
    std::string file;
    if (zip != nullptr && zip_stat(zip, "glyphset.cgf", 0, &status) == 0) {
        file.resize(status.size);
        zip_file_t* const entry = zip_fopen(zip, "glyphset.cgf", 0);
        zip_fread(entry, file.data(), file.size());
        zip_fclose(entry);
    }
    zip_discard(zip);
    return file;
}

std::size_t UsedMemory()
{
    struct mallinfo2 const info = mallinfo2();
    return info.uordblks + info.hblkhd;
}

}

void AddRows()
{
    constexpr std::size_t kMostMemory = 4;  // times the file
    std::string const file = ReadFile();
    if (file.empty()) return;  // there is no such font yet
    static std::unique_ptr<std::uint8_t[]> widths[256];
    static unsigned short text[80];
    {
        NewFont();
        std::size_t const before = UsedMemory();
        auto const font = NewFont();
        std::size_t const used = UsedMemory() - before;
        std::fprintf(stderr, "bench: the built-in font takes %.2f times the memory of its file\n",
            static_cast<double>(used) / static_cast<double>(file.size()));
        ExpectSame(font->IsValid() && used <= kMostMemory * file.size(), "memory of the built-in font");
        for (unsigned i = 0; i < std::size(text); ++i)
            text[i] = static_cast<unsigned short>(i % 3 ? 'a' + i % 26 : 0x4E00 + i * 97);
        for (unsigned code = 0; code < 0x10000; ++code) {
            auto& set = widths[code / 256];
            if (!set) set = std::make_unique<std::uint8_t[]>(256);
            auto const character = static_cast<unsigned short>(code);
            set[code % 256] = static_cast<std::uint8_t>(font->GetTextWidthW(&character, 1));
        }
    }

    std::string const loading = "loading the built-in font", measuring = "measuring in the built-in font";
    AddContender(loading, kOurs, [](benchmark::State& state) {
        for (auto _ : state)
            benchmark::DoNotOptimize(NewFont());
    });
    AddContender(loading, kLibzip, [](benchmark::State& state) {
        for (auto _ : state)
            benchmark::DoNotOptimize(ReadFile());
    });
    AddContender(measuring, kOurs, [](benchmark::State& state) {
        auto const font = NewFont();
        for (auto _ : state)
            benchmark::DoNotOptimize(font->GetTextWidthW(text, std::size(text)));
    });
    AddContender(measuring, kPlain, [](benchmark::State& state) {
        for (auto _ : state) {
            unsigned sum = 0;
            for (unsigned const code : text)
                sum += widths[code / 256][code % 256];
            benchmark::DoNotOptimize(sum);
        }
    });
}

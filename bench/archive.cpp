#include <bench/rows.h>

#include <common/bundle_api.h>

#include <benchmark/benchmark.h>
#include <memory>
#include <string>
#include <vector>
#include <zip.h>

// What a session reads of the library's archive when it starts, beside libzip reading the same from an
// archive that is a file of its own. Both open it anew each time.

namespace {

using Data = std::unique_ptr<unsigned char[]>;

/// Without what is not there yet.
constexpr char const* kNames[] = {"locales", "keyboard.kbd"};

std::string ReadFromLibrary()
{
    std::string const path = LIBRARY;
    auto* const module =
        BundleApi::OpenModule(std::basic_string<unsigned short>(path.begin(), path.end()).c_str());
    std::string all;
    for (char const* const name : kNames) {
        auto* const file = BundleApi::OpenFile(module, name, nullptr);
        if (file == nullptr) continue;
        unsigned long long size = 0;
        BundleApi::GetFileSize(file, &size);
        Data const data(new unsigned char[size]);
        unsigned read = 0;
        BundleApi::ReadFile(file, data.get(), static_cast<unsigned>(size), &read);
        all.append(data.get(), data.get() + read);
        BundleApi::CloseFile(file);
    }
    BundleApi::CloseModule(module);
    return all;
}

std::string ReadFromZip()
{
    zip_t* const zip = zip_open(ARCHIVE, ZIP_RDONLY, nullptr);
    std::string all;
    for (char const* const name : kNames) {
        zip_stat_t status;
        if (zip == nullptr || zip_stat(zip, name, 0, &status) != 0) continue;
        zip_file_t* const file = zip_fopen(zip, name, 0);
        Data const data(new unsigned char[status.size]);
        all.append(data.get(), data.get() + zip_fread(file, data.get(), status.size));
        zip_fclose(file);
    }
    zip_discard(zip);
    return all;
}

void Repeat(benchmark::State& state, std::string (*read)())
{
    for (auto _ : state)
        benchmark::DoNotOptimize(read());
}

}

void AddRows()
{
    BundleApi::SetLanguage("en");
    std::string const row = "start-up: archive and key layouts";
    ExpectSame(!ReadFromZip().empty() && ReadFromLibrary() == ReadFromZip(), row);
    AddContender(row, kOurs, [](benchmark::State& state) { Repeat(state, ReadFromLibrary); });
    AddContender(row, kLibzip, [](benchmark::State& state) { Repeat(state, ReadFromZip); });
}

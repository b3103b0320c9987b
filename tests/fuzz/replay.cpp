// Runs a fuzz target over the files of a folder and damaged copies of them, for builds without libFuzzer.
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size);

int main(int /*argc*/, char** argv)
{
    std::mt19937 random(6);
    int inputs = 0;
    for (auto const& entry : std::filesystem::directory_iterator(argv[1])) {
        std::ifstream file(entry.path(), std::ios::binary);
        std::vector<unsigned char> const whole(std::istreambuf_iterator<char>(file), {});
        for (unsigned round = 0; round < 1000; ++round) {
            auto bytes = whole;
            for (unsigned i = round % 4; i > 0; --i)
                bytes[random() % bytes.size()] = static_cast<unsigned char>(random());
            if (round % 5 == 4) bytes.resize(random() % bytes.size());
            inputs += LLVMFuzzerTestOneInput(bytes.data(), bytes.size()) == 0;
        }
    }
    return inputs > 0 ? 0 : 1;
}

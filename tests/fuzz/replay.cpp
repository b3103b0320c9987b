// Stands in for the fuzzer: gives it each file of the command line once.

#include <cstdint>
#include <fstream>
#include <iterator>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* bytes, std::size_t size);

int main(int count, char** words)
{
    for (int i = 1; i < count; ++i) {
        std::ifstream file(words[i], std::ios::binary);
        if (!file) return 1;
        std::string const bytes(std::istreambuf_iterator<char>(file), {});
        LLVMFuzzerTestOneInput(reinterpret_cast<std::uint8_t const*>(bytes.data()), bytes.size());
    }
    return count > 1 ? 0 : 1;
}

// SPDX-License-Identifier: MIT
// Runs a fuzz target on the inputs that are kept, in a build without libFuzzer.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "check.hpp"

namespace
{

std::vector<std::filesystem::path> listInputs(const std::filesystem::path &corpus)
{
    std::vector<std::filesystem::path> inputs;
    for (const auto &entry : std::filesystem::directory_iterator(corpus))
        inputs.push_back(entry.path());
    std::sort(inputs.begin(), inputs.end());
    return inputs;
}

std::vector<std::uint8_t> read(const std::filesystem::path &input)
{
    std::ifstream stream(input, std::ios::binary);
    std::vector<std::uint8_t> bytes(std::istreambuf_iterator<char>(stream), {});
    if (!stream)
    {
        std::fprintf(stderr, "can't read %s\n", input.c_str());
        std::exit(2);
    }
    return bytes;
}

} // namespace

int main(int count, char **arguments)
{
    if (count != 2)
    {
        std::fprintf(stderr, "Usage: %s CORPUS\n", arguments[0]);
        return 2;
    }
    const auto inputs = listInputs(arguments[1]);
    for (const auto &input : inputs)
    {
        // What comes last is what failed.
        std::printf("%s\n", input.filename().c_str());
        std::fflush(stdout);
        const std::vector<std::uint8_t> bytes = read(input);
        LLVMFuzzerTestOneInput(bytes.data(), bytes.size());
    }
    std::printf("%zu inputs\n", inputs.size());
    return inputs.empty() ? 1 : 0;
}

// tests/fuzz/replay.cpp: runs a fuzzer over files, without libFuzzer.
//
//   fuzz_NAME FILE-OR-FOLDER...
#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size);

namespace {

namespace fs = std::filesystem;

std::vector<fs::path> filesIn(const fs::path &given) {
    if (!fs::is_directory(given)) {
        return {given};
    }
    std::vector<fs::path> files(fs::directory_iterator(given), fs::directory_iterator{});
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace

int main(int argc, char *argv[]) {
    std::vector<std::vector<char>> inputs; // read before the fuzzer goes to a folder of its own
    std::vector<fs::path> names;
    for (int i = 1; i < argc; ++i) {
        for (const fs::path &file : filesIn(argv[i])) {
            std::ifstream in(file, std::ios::binary);
            if (!in) {
                std::cerr << "cannot read " << file << '\n';
                return EXIT_FAILURE;
            }
            inputs.emplace_back(std::istreambuf_iterator<char>(in),
                                std::istreambuf_iterator<char>());
            names.push_back(file);
        }
    }
    for (std::size_t i = 0; i < inputs.size(); ++i) {
        std::cerr << names[i].string() << std::endl; // before it can end the process
        LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t *>(inputs[i].data()),
                               inputs[i].size());
    }
    std::cout << inputs.size() << " inputs\n";
    return inputs.empty() ? EXIT_FAILURE : EXIT_SUCCESS;
}

// Stands in for libFuzzer's driver when a fuzz target is built without it: runs the
// target once on every file named on the command line, or found (recursively, in
// name order) under a folder named there. This is how the seed and regression inputs
// run as ordinary tests with any compiler.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <string>
#include <system_error>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace {

std::vector<std::filesystem::path> inputsUnder(const std::filesystem::path& path) {
    std::vector<std::filesystem::path> files;
    std::error_code ec;
    if (std::filesystem::is_directory(path, ec)) {
        for (const auto& entry : std::filesystem::recursive_directory_iterator(path, ec))
            if (entry.is_regular_file(ec))
                files.push_back(entry.path());
        std::sort(files.begin(), files.end());
    } else if (std::filesystem::is_regular_file(path, ec)) {
        files.push_back(path);
    }
    return files;
}

} // namespace

int main(int argc, char** argv) {
    size_t replayed = 0;
    for (int i = 1; i < argc; ++i) {
        std::error_code ec;
        if (!std::filesystem::exists(argv[i], ec)) {
            std::fprintf(stderr, "%s: %s does not exist\n", argv[0], argv[i]);
            return 2;
        }
        const std::vector<std::filesystem::path> files = inputsUnder(argv[i]);
        for (const auto& file : files) {
            std::ifstream in(file, std::ios::binary);
            const std::vector<char> bytes((std::istreambuf_iterator<char>(in)),
                                          std::istreambuf_iterator<char>());
            if (!in.eof() && in.fail()) {
                std::fprintf(stderr, "%s: cannot read %s\n", argv[0], file.c_str());
                return 2;
            }
            // A copy of exactly the input's size, so a read past its end is caught by
            // the address sanitizer as it would be under libFuzzer.
            std::unique_ptr<uint8_t[]> data(new uint8_t[bytes.size()]);
            std::copy(bytes.begin(), bytes.end(), data.get());
            LLVMFuzzerTestOneInput(data.get(), bytes.size());
            ++replayed;
        }
    }
    std::printf("%s: replayed %zu inputs\n", argv[0], replayed);
    return replayed > 0 ? 0 : 2;
}

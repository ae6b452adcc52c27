// Runs files through a fuzz target's entry point without libFuzzer: every
// argument is a file or a directory whose regular files are run in name
// order. A missing argument path is an error; an empty directory is not.
#include <dirent.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);
extern "C" __attribute__((weak)) int LLVMFuzzerInitialize(int* argc, char*** argv);

namespace {

bool isDirectory(const std::string& path, bool& exists) {
    struct stat st {};
    exists = stat(path.c_str(), &st) == 0;
    return exists && S_ISDIR(st.st_mode);
}

std::vector<std::string> filesOf(const std::string& dir) {
    std::vector<std::string> files;
    if (DIR* d = opendir(dir.c_str())) {
        while (dirent* e = readdir(d)) {
            std::string path = dir + "/" + e->d_name;
            struct stat st {};
            if (e->d_name[0] != '.' && stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode)) files.push_back(path);
        }
        closedir(d);
    }
    std::sort(files.begin(), files.end());
    return files;
}

void runFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::vector<char> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    // A copy of exactly the file's size, so a read past the input's end is
    // seen by the address checker as it is under libFuzzer.
    std::vector<std::uint8_t> data(bytes.begin(), bytes.end());
    std::uint8_t* copy = data.empty() ? nullptr : new std::uint8_t[data.size()];
    std::copy(data.begin(), data.end(), copy);
    LLVMFuzzerTestOneInput(copy, data.size());
    delete[] copy;
}

}  // namespace

int main(int argc, char** argv) {
    if (LLVMFuzzerInitialize != nullptr) LLVMFuzzerInitialize(&argc, &argv);
    int files = 0;
    for (int i = 1; i < argc; ++i) {
        bool exists = false;
        std::vector<std::string> list = isDirectory(argv[i], exists) ? filesOf(argv[i])
                                                                     : std::vector<std::string>{argv[i]};
        if (!exists) {
            std::fprintf(stderr, "%s: no such file or directory\n", argv[i]);
            return 1;
        }
        for (const std::string& f : list) {
            std::fprintf(stderr, "replaying %s\n", f.c_str());
            runFile(f);
            ++files;
        }
    }
    std::fprintf(stderr, "%d inputs replayed\n", files);
    return 0;
}

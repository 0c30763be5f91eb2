// Lists a folder in the order the runtime's file search returns its entries, the order the explorer's
// folder read meets them in (the file system's own, which tests must not guess):
//   scan_order_probe FOLDER
// Prints one name a line ("." and ".." left out). Exit code 0, or 1 when the folder cannot be searched.
#include <io.h>

#include <cstdio>
#include <cstring>
#include <string>

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: scan_order_probe FOLDER\n");
        return 2;
    }
    const std::string pattern = std::string(argv[1]) + "\\*";
    struct __finddata64_t found;
    const intptr_t search = _findfirst64(pattern.c_str(), &found);
    if (search == -1) {
        std::fprintf(stderr, "scan_order_probe: cannot search %s\n", argv[1]);
        return 1;
    }
    do {
        if (std::strcmp(found.name, ".") != 0 && std::strcmp(found.name, "..") != 0)
            std::printf("%s\n", found.name);
    } while (_findnext64(search, &found) == 0);
    _findclose(search);
    return 0;
}

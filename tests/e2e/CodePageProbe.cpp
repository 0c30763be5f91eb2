// Prints the ANSI code page Wine gives its programs, then, for each argument, whether a file of that
// (narrow, ANSI) name exists: the code-page tests check both before they rely on the locale.
#include <windows.h>

#include <cstdio>

int main(int argc, char** argv) {
    std::printf("acp %u\n", ::GetACP());
    for (int i = 1; i < argc; ++i)
        std::printf("%s %s\n",
                    ::GetFileAttributesA(argv[i]) != INVALID_FILE_ATTRIBUTES ? "exists" : "missing", argv[i]);
    return 0;
}

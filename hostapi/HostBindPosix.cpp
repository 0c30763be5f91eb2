// Native builds have no host process to bind from: the table stays empty until a test fills it.
#include "hostapi/HostApi.h"

#include <cstdio>

int BindHostApi(HostApi&) {
    return 0;
}

void WriteDebuggerLine(const char* text) {
    std::fputs(text, stderr);
}

// What the process holds of the system's objects, counted from outside the library: the GDI objects,
// the windows, the kernel handles and the threads. Printed after each call with --resources, so that a
// test can see that calls in a row leave nothing behind.
#pragma once

#include <string>

namespace devhost {

struct ProcessResources {
    long gdiObjects = -1; // -1: the count could not be taken
    long windows = 0;     // windows of the process's threads, top-level and child
    long handles = 0;
    long threads = 0;
};

ProcessResources CountProcessResources();

// "[host] resources WHEN: gdi=G windows=W handles=H threads=T"
std::wstring ResourcesLine(const ProcessResources& resources, const std::wstring& when);

} // namespace devhost

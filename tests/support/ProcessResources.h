// What the process holds of the system's objects: its GDI objects, windows, kernel handles and threads,
// counted in ways that work under Wine too (where GetGuiResources and GetProcessHandleCount answer 0).
// For the tests that check that calls and loaders leave nothing behind, and devhost's --resources.
#pragma once

namespace testsupport {

struct ProcessResources {
    long gdiObjects = -1; // -1: the count could not be taken
    long windows = 0;     // windows of the process's threads, top-level and child
    long handles = 0;
    long threads = 0;
};

// The GDI objects of the process, from the GDI handle table its process block points to; -1 without one.
long CountGdiObjects();
// Each possible handle value asked about with GetHandleInformation.
long CountHandles();
// The process's threads in a tool-help snapshot.
long CountThreads();

// All four, counted again until two counts in a row agree (a second at most): a thread that was
// ending still holds its handles for a moment.
ProcessResources CountProcessResources();

bool operator==(const ProcessResources& a, const ProcessResources& b);

} // namespace testsupport

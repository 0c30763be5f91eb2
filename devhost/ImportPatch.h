// Puts devhost's own functions in a loaded module's import table, so that devhost sees (and may slow) the
// module's calls of a few system functions without the module changing or exporting anything for it.
#pragma once

#include <windows.h>

namespace devhost {

// Replaces the address of the imported function `name` in module's import table by `replacement` and
// returns the address it held (nullptr when the module does not import it).
void* PatchImport(HMODULE module, const char* name, void* replacement);

// PatchImport for a typed function: original gets the system's function; false when not imported.
template <class Fn> bool Watch(HMODULE module, const char* name, Fn replacement, Fn& original) {
    void* was = PatchImport(module, name, reinterpret_cast<void*>(replacement));
    if (!was)
        return false;
    original = reinterpret_cast<Fn>(was);
    return true;
}

} // namespace devhost

// Stores that differ all through, for the tests of writers racing on one file: a mix of two of them
// cannot pass for either.
#pragma once

#include "settings/IniFile.h"

#include <string>

inline void FillTaggedStore(CIniFile& ini, const std::string& tag) {
    for (int i = 0; i < 200; ++i)
        ini.SetValue("Section " + tag, "key" + std::to_string(i),
                     tag + std::string(60, tag[0]) + std::to_string(i));
}

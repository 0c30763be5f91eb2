// The names' code page outside Windows: the Western one, which the tests and benchmarks assume.
#include "thumbs/NameFold.h"

const NameFoldTable& NameFold() {
    static const NameFoldTable table = Windows1252NameFold();
    return table;
}

// The names' collation outside Windows: the stand-in over the Western code page.
#include "thumbs/NameCollation.h"

NameCollation& ActiveNameCollation() {
    static const std::unique_ptr<NameCollation> collation =
        FoldedNameCollation(NameFold(), ActiveLeadBytes());
    return *collation;
}

// Case folding of drawing names, one byte at a time through a 256-entry table of the ANSI code page. The
// scan lowers names with it and the exact-name comparisons (finding a drawing by name, a rename that
// changes only the case) go through it, so they agree on which letters are the same, and a comparison
// costs one table look-up per byte. The order of names and the search by prefix follow the locale
// instead (NameCollation.h). Portable: no <windows.h>; the Windows build fills the table from the
// system's code page.
#pragma once

#include <string>

struct NameFoldTable {
    unsigned char lower[256]; // the lower-case form of each single byte
    bool leadByte[256];       // first byte of a double-byte character: it and the next byte stay as they are
};

// A table from a rule for one byte. isLead may be null (a single-byte code page).
NameFoldTable MakeNameFold(unsigned char (*lower)(unsigned char), bool (*isLead)(unsigned char));

// The Western European code page (1252): ASCII letters, the accented letters C0-DE but the multiplication
// sign, and S, OE, Z with caron or ligature, Y with diaeresis.
NameFoldTable Windows1252NameFold();

// The table of the code page the names are in: built on first use and shared. Windows: the system's
// ANSI code page; elsewhere the Western one.
const NameFoldTable& NameFold();

// Lowers name in place; the bytes of double-byte characters are kept.
void FoldNameInPlace(std::string& name, const NameFoldTable& fold = NameFold());

// Negative, 0 or positive, comparing folded bytes as unsigned values; a prefix sorts first.
int CompareNamesNoCase(const std::string& a, const std::string& b, const NameFoldTable& fold = NameFold());

// True when name starts with text, case ignored; a name equal to the text starts with it.
bool StartsWithNoCase(const std::string& name, const std::string& text,
                      const NameFoldTable& fold = NameFold());

// The order of drawing names and the search's "starts with", as the system's file manager has them:
// letters by the user's locale with case and width ignored (a full-width B is a b), runs of digits by
// their value ("door-900" before "door-1000").
//
// Each character of the code page is looked up in the collation once and its weights kept; a name's
// sort key is then put together from them, once per sort, and the sort compares keys as bytes instead of
// asking the locale for every comparison. Portable: no <windows.h>. The Windows build takes the weights
// from the system's collation; elsewhere a stand-in (the code page's letters folded, other bytes as they
// are) runs the same key builder for the native tests and the benchmarks.
#pragma once

#include "hostapi/NarrowText.h"
#include "thumbs/NameFold.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

constexpr std::uint8_t kNotADigit = 0xFF;

// What the collation says of one character of the code page.
struct CharacterWeights {
    static constexpr int kCapacity = 22;
    std::uint8_t digit = kNotADigit; // 0-9 for a digit (half- or full-width), else kNotADigit
    std::uint8_t primaryLength = 0;  // the first bytes of key, those that order names; 0 for a character
                                     // the order passes over (a hyphen)
    std::uint8_t keyLength = 0;      // all of key: what the search compares
    std::uint8_t key[kCapacity] = {};
};

class NameCollation {
public:
    // code: a single byte, or a lead byte times 256 plus its trail byte.
    using WeightsOf = std::function<CharacterWeights(unsigned code)>;

    // numberMark: the byte a run of digits starts with in a key, where the collation puts digits
    // among the other characters.
    NameCollation(const LeadByteTable& lead, WeightsOf weightsOf, std::uint8_t numberMark);
    NameCollation(const NameCollation&) = delete;
    NameCollation& operator=(const NameCollation&) = delete;
    ~NameCollation();

    // Appends the sort key of name to key. Keys compare as unsigned bytes (std::string's order): letters
    // by their weights, a run of digits by its value, however many digits it has (leading zeros do not
    // count). Names whose keys are equal ("file01" and "file1", "B" and a full-width B) are ordered by
    // the caller.
    void AppendSortKey(const std::string& name, std::string& key);
    std::string SortKey(const std::string& name);

    // True when name starts with text, character by character, case and width ignored; a name equal to
    // the text starts with it, every name starts with an empty text.
    bool StartsWith(const std::string& name, const std::string& text);

    // The weights of one character, asked of the collation on first use and kept.
    const CharacterWeights& Weights(unsigned code);

private:
    struct Block;
    unsigned CodeAt(const std::string& text, std::size_t at, std::size_t end) const;

    LeadByteTable m_lead;
    WeightsOf m_weightsOf;
    std::uint8_t m_numberMark;
    std::unique_ptr<Block> m_blocks[256]; // by lead byte; block 0 holds the single bytes
};

// The stand-in collation: each byte folded through fold (ASCII and the code page's letters), digits
// '0'-'9' by value, the two bytes of a double-byte character as they are. Digits sort where '0' does
// among the bytes.
std::unique_ptr<NameCollation> FoldedNameCollation(const NameFoldTable& fold, const LeadByteTable& lead);

// The collation the names are sorted and searched with, built on first use and shared: on Windows the
// user's locale over the system's ANSI code page; elsewhere the stand-in over the Western code page.
NameCollation& ActiveNameCollation();

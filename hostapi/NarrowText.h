// Narrow text (the ANSI code page) walked by character. In the double-byte code pages (932, 936, 949,
// 950) a character is a lead byte and the byte after it, and that second byte can be 0x5C ("\") or 0x7C
// ("|"): a path is only ever looked at character by character, so a separator or a forbidden character is
// never read out of the middle of one.
//
// Every function takes the lead bytes to walk by; the default is the active code page's: the system's on
// Windows, the Western one (no lead bytes) elsewhere. Portable: the tables of the double-byte code pages
// are written out here, so the tests walk each of them on any machine.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

struct LeadByteTable {
    bool lead[256]; // the first byte of a double-byte character
};

// The lead bytes of a code page: 932 (Japanese), 936 (Simplified Chinese), 949 (Korean) and 950
// (Traditional Chinese); any other code page (1252 among them) has none.
LeadByteTable LeadBytesOfCodePage(unsigned codePage);

// The lead bytes of the code page the library's narrow text is in, built on first use. Windows: the
// system's ANSI code page; elsewhere the Western one.
const LeadByteTable& ActiveLeadBytes();

// The position of the character after the one starting at at: two bytes for a lead byte that has a byte
// after it, else one.
std::size_t NextCharacter(const std::string& text, std::size_t at,
                          const LeadByteTable& lead = ActiveLeadBytes());

// The position where each character of text starts.
std::vector<std::size_t> CharacterStarts(const std::string& text,
                                         const LeadByteTable& lead = ActiveLeadBytes());

// How many characters text holds: what a message calls its length.
std::size_t CharacterCount(const std::string& text, const LeadByteTable& lead = ActiveLeadBytes());

// True when the last character of text is a separator ("\" or "/").
bool EndsWithSeparator(const std::string& text, const LeadByteTable& lead = ActiveLeadBytes());

// The position of the last character of text that is one of the single-byte characters of set, or npos.
std::size_t LastCharacterOf(const std::string& text, const char* set,
                            const LeadByteTable& lead = ActiveLeadBytes());

// The position of the last separator ("\" or "/") of text, or npos.
std::size_t LastSeparator(const std::string& text, const LeadByteTable& lead = ActiveLeadBytes());

// The position of the first character at or after from that is the single-byte character c, or npos. from
// must be the start of a character.
std::size_t FindCharacter(const std::string& text, char c, std::size_t from = 0,
                          const LeadByteTable& lead = ActiveLeadBytes());

// path with a "\" added unless it ends in a separator already; an empty path stays empty.
std::string WithSeparator(const std::string& path, const LeadByteTable& lead = ActiveLeadBytes());

// The names of a label path ("Desktop\My Computer\(C:)\Work\"), split at each "\": every name, the empty
// ones included (a path ending in "\" ends with an empty name).
std::vector<std::string> SplitLabelPath(const std::string& labelPath,
                                        const LeadByteTable& lead = ActiveLeadBytes());

// True when name holds a character a file name cannot: \ / : * ? " < > | or a control character.
bool ContainsForbiddenCharacter(const std::string& name, const LeadByteTable& lead = ActiveLeadBytes());

// A length for a message about a buffer of bytes: "12 characters" when each character is one byte, else
// "161 characters, 301 bytes" (the limit is then to be said in bytes too).
std::string CharactersAndBytes(const std::string& text, const LeadByteTable& lead = ActiveLeadBytes());

// The text with a line break put into every word (a run without blanks or line breaks) longer than
// maxChars characters: after its last "\" or "/" that leaves at least half a line, else after maxChars
// characters. A message box wraps lines only at blanks, so one long name (a path, a file name of 300
// characters) would make it wider than the screen.
// The longest word a message of the library puts on one line: about half of a small screen's width.
constexpr std::size_t kMessageWordChars = 80;
std::string BreakLongWords(const std::string& text, std::size_t maxChars,
                           const LeadByteTable& lead = ActiveLeadBytes());
// The same for text in Unicode (UTF-16; a character is one code unit here).
std::wstring BreakLongWords(const std::wstring& text, std::size_t maxChars);

// The unit of a limit of bytes said of text: "characters" when each character of text is one byte (the
// two are the same), else "bytes".
const char* ByteLimitUnit(const std::string& text, const LeadByteTable& lead = ActiveLeadBytes());

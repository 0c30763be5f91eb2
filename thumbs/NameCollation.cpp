#include "thumbs/NameCollation.h"

#include <cstring>
#include <utility>

struct NameCollation::Block {
    bool known[256] = {};
    CharacterWeights weights[256];
};

NameCollation::NameCollation(const LeadByteTable& lead, WeightsOf weightsOf, std::uint8_t numberMark)
    : m_lead(lead), m_weightsOf(std::move(weightsOf)), m_numberMark(numberMark) {}

NameCollation::~NameCollation() = default;

const CharacterWeights& NameCollation::Weights(unsigned code) {
    code &= 0xFFFF;
    const unsigned low = code & 0xFF;
    Block* known = m_blocks[code >> 8].get();
    if (known != nullptr && known->known[low])
        return known->weights[low];
    std::unique_ptr<Block>& block = m_blocks[code >> 8];
    if (!block)
        block = std::make_unique<Block>();
    CharacterWeights w = m_weightsOf(code);
    if (w.keyLength > CharacterWeights::kCapacity)
        w.keyLength = CharacterWeights::kCapacity;
    if (w.primaryLength > w.keyLength)
        w.primaryLength = w.keyLength;
    block->weights[low] = w;
    block->known[low] = true;
    return block->weights[low];
}

unsigned NameCollation::CodeAt(const std::string& text, std::size_t at, std::size_t end) const {
    const auto first = static_cast<unsigned char>(text[at]);
    if (end - at == 2)
        return first * 256u + static_cast<unsigned char>(text[at + 1]);
    return first;
}

namespace {

// A run of digits as its value: the mark, how many digits are left without the leading zeros (itself
// written as a byte count and that many bytes, most significant first, so that a longer number sorts
// after a shorter one whatever its length), then the digits. Nothing is converted to an integer: a run
// of any length keeps its order.
void AppendNumber(const std::string& digits, std::uint8_t mark, std::string& key) {
    std::size_t first = 0;
    while (first < digits.size() && digits[first] == 0)
        ++first;
    const std::size_t count = digits.size() - first;
    std::uint8_t countBytes[sizeof(std::size_t)];
    int n = 0;
    for (std::size_t rest = count; n == 0 || rest != 0; rest >>= 8)
        countBytes[n++] = static_cast<std::uint8_t>(rest & 0xFF);
    key.push_back(static_cast<char>(mark));
    key.push_back(static_cast<char>(n));
    while (n > 0)
        key.push_back(static_cast<char>(countBytes[--n]));
    key.append(digits, first, std::string::npos);
}

} // namespace

void NameCollation::AppendSortKey(const std::string& name, std::string& key) {
    // Weights gather in a buffer on the stack and go to key in a few appends: one append a character
    // would cost more than the look-up itself, and a sort builds a key for every record.
    char buffer[512];
    std::size_t used = 0;
    std::string digits;
    const std::size_t size = name.size();
    const auto* bytes = reinterpret_cast<const unsigned char*>(name.data());
    std::size_t at = 0;
    while (at < size) {
        unsigned code = bytes[at];
        std::size_t next = at + 1;
        if (m_lead.lead[code] && next < size)
            code = code * 256u + bytes[next++];
        const CharacterWeights* w = &Weights(code);
        if (w->digit == kNotADigit) {
            if (used + CharacterWeights::kCapacity > sizeof buffer) {
                key.append(buffer, used);
                used = 0;
            }
            std::memcpy(buffer + used, w->key, w->primaryLength);
            used += w->primaryLength;
            at = next;
            continue;
        }
        key.append(buffer, used);
        used = 0;
        digits.clear();
        while (w->digit != kNotADigit) {
            digits.push_back(static_cast<char>(w->digit));
            at = next;
            if (at >= size)
                break;
            code = bytes[at];
            next = at + 1;
            if (m_lead.lead[code] && next < size)
                code = code * 256u + bytes[next++];
            w = &Weights(code);
        }
        AppendNumber(digits, m_numberMark, key);
    }
    key.append(buffer, used);
}

std::string NameCollation::SortKey(const std::string& name) {
    std::string key;
    AppendSortKey(name, key);
    return key;
}

bool NameCollation::StartsWith(const std::string& name, const std::string& text) {
    std::size_t n = 0;
    std::size_t t = 0;
    while (t < text.size()) {
        if (n >= name.size())
            return false;
        const std::size_t nextN = NextCharacter(name, n, m_lead);
        const std::size_t nextT = NextCharacter(text, t, m_lead);
        const CharacterWeights& a = Weights(CodeAt(name, n, nextN));
        const CharacterWeights& b = Weights(CodeAt(text, t, nextT));
        if (&a != &b && (a.keyLength != b.keyLength || std::memcmp(a.key, b.key, a.keyLength) != 0))
            return false;
        n = nextN;
        t = nextT;
    }
    return true;
}

std::unique_ptr<NameCollation> FoldedNameCollation(const NameFoldTable& fold, const LeadByteTable& lead) {
    auto weightsOf = [fold](unsigned code) {
        CharacterWeights w;
        if (code > 0xFF) {
            w.key[0] = static_cast<std::uint8_t>(code >> 8);
            w.key[1] = static_cast<std::uint8_t>(code & 0xFF);
            w.keyLength = w.primaryLength = 2;
            return w;
        }
        if (code >= '0' && code <= '9')
            w.digit = static_cast<std::uint8_t>(code - '0');
        w.key[0] = fold.lower[code];
        w.keyLength = w.primaryLength = 1;
        return w;
    };
    return std::make_unique<NameCollation>(lead, weightsOf, static_cast<std::uint8_t>('0'));
}

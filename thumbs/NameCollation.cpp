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
    std::unique_ptr<Block>& block = m_blocks[code >> 8];
    if (!block)
        block = std::make_unique<Block>();
    const unsigned low = code & 0xFF;
    if (!block->known[low]) {
        CharacterWeights w = m_weightsOf(code);
        if (w.keyLength > CharacterWeights::kCapacity)
            w.keyLength = CharacterWeights::kCapacity;
        if (w.primaryLength > w.keyLength)
            w.primaryLength = w.keyLength;
        block->weights[low] = w;
        block->known[low] = true;
    }
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
    std::string digits;
    std::size_t at = 0;
    while (at < name.size()) {
        std::size_t next = NextCharacter(name, at, m_lead);
        const CharacterWeights* w = &Weights(CodeAt(name, at, next));
        if (w->digit == kNotADigit) {
            key.append(reinterpret_cast<const char*>(w->key), w->primaryLength);
            at = next;
            continue;
        }
        digits.clear();
        while (w->digit != kNotADigit) {
            digits.push_back(static_cast<char>(w->digit));
            at = next;
            if (at >= name.size())
                break;
            next = NextCharacter(name, at, m_lead);
            w = &Weights(CodeAt(name, at, next));
        }
        AppendNumber(digits, m_numberMark, key);
    }
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

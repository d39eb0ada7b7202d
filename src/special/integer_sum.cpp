#include "special/hypergeometric_terms.h"

#include "frame/constants.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace qx {

namespace {

constexpr int kWordBits = 32;
constexpr int kMostWords = 64;       // in a term
constexpr int kFactorWords = 8;      // in a parameter plus the number of the term
constexpr double kMostWork = 200000; // words in all terms, a few milliseconds
constexpr double kMostLargest = 1e7; // log2 of the largest term
constexpr int kMostBelow = 5;        // words of a parameter below the binary point
constexpr double kParameterLimit = 0x1p40;

// The magnitude of an integer, lowest word first, times 2^(32 exponent).
template <int Words>
struct Magnitude {
    uint32_t word[Words];
    int length; // without leading zero words
    int exponent;

    void trim() {
        while (length > 0 && word[length - 1] == 0)
            --length;
    }
    // Keeps the upper `most` words.
    void cut(int most) {
        if (length <= most)
            return;
        const int drop = length - most;
        for (int i = 0; i < most; ++i)
            word[i] = word[i + drop];
        length = most;
        exponent += drop;
    }
};

typedef Magnitude<kMostWords + 2 * kFactorWords> Term;
typedef Magnitude<2 * kFactorWords> Factor;

// A parameter as a two's complement integer times 2^(32 exponent), to which 1 is added for each
// term.
class Parameter {
public:
    // Returns false if it has too many digits.
    bool set(Extended x) {
        exponent_ = 0;
        if (!std::isfinite(x.high) || !std::isfinite(x.low))
            return false;
        for (const double part : {x.high, x.low})
            if (part != 0)
                exponent_ = std::min(exponent_, lowestWord(part));
        if (std::fabs(x.high) > kParameterLimit || -exponent_ > kMostBelow)
            return false;
        for (uint32_t &word : word_)
            word = 0;
        add(x.high);
        add(x.low);
        return true;
    }
    void increment() { addWord(1, -exponent_); }

    bool isNegative() const { return word_[kFactorWords - 1] >> 31 != 0; }
    void magnitude(Factor &out) const {
        uint64_t carry = isNegative() ? 1 : 0;
        for (int i = 0; i < kFactorWords; ++i) {
            carry += isNegative() ? ~word_[i] : word_[i];
            out.word[i] = static_cast<uint32_t>(carry);
            carry >>= kWordBits;
        }
        out.length = kFactorWords;
        out.exponent = exponent_;
        out.trim();
    }

private:
    // The exponent of the word that contains the lowest bit of a double.
    static int lowestWord(double x) {
        int e = 0;
        double rest = std::fabs(std::frexp(x, &e));
        int digits = 0;
        for (; rest != 0; rest -= std::floor(rest), ++digits)
            rest *= 2;
        return static_cast<int>(std::floor((e - digits) / static_cast<double>(kWordBits)));
    }
    void add(double x) {
        double rest = std::fabs(std::ldexp(x, -kWordBits * exponent_));
        for (int i = kFactorWords - 1; i >= 0 && rest > 0; --i) {
            const double unit = std::ldexp(1.0, kWordBits * i);
            const double digit = std::floor(rest / unit);
            rest -= digit * unit;
            const auto word = static_cast<uint32_t>(digit);
            if (x > 0)
                addWord(word, i);
            else
                subtractWord(word, i);
        }
    }
    void addWord(uint32_t x, int place) {
        uint64_t carry = x;
        for (int i = place; i < kFactorWords && carry != 0; ++i) {
            carry += word_[i];
            word_[i] = static_cast<uint32_t>(carry);
            carry >>= kWordBits;
        }
    }
    void subtractWord(uint32_t x, int place) {
        uint32_t borrow = x;
        for (int i = place; i < kFactorWords && borrow != 0; ++i) {
            const uint32_t before = word_[i];
            word_[i] = before - borrow;
            borrow = word_[i] > before ? 1 : 0;
        }
    }

    uint32_t word_[kFactorWords];
    int exponent_;
};

void Multiply(Term &term, const Factor &by) {
    Term product;
    product.length = term.length + by.length;
    product.exponent = term.exponent + by.exponent;
    for (int i = 0; i < product.length; ++i)
        product.word[i] = 0;
    for (int j = 0; j < by.length; ++j) {
        uint64_t carry = 0;
        for (int i = 0; i < term.length; ++i) {
            carry += static_cast<uint64_t>(term.word[i]) * by.word[j] + product.word[i + j];
            product.word[i + j] = static_cast<uint32_t>(carry);
            carry >>= kWordBits;
        }
        product.word[term.length + j] = static_cast<uint32_t>(carry);
    }
    product.trim();
    term.length = product.length;
    term.exponent = product.exponent;
    for (int i = 0; i < product.length; ++i)
        term.word[i] = product.word[i];
}

void MultiplyByWord(Factor &factor, uint32_t by) {
    uint64_t carry = 0;
    for (int i = 0; i < factor.length; ++i) {
        carry += static_cast<uint64_t>(factor.word[i]) * by;
        factor.word[i] = static_cast<uint32_t>(carry);
        carry >>= kWordBits;
    }
    if (carry != 0)
        factor.word[factor.length++] = static_cast<uint32_t>(carry);
}

int LeadingZeros(uint32_t x) {
    int zeros = 0;
    for (; (x & 0x80000000U) == 0; x <<= 1)
        ++zeros;
    return zeros;
}

// The quotient to `words` words, by D. E. Knuth, The Art of Computer Programming, volume 2, 4.3.1,
// algorithm D.
void Divide(Term &term, Factor by, int words) {
    const int m = by.length;
    const int shift = LeadingZeros(by.word[m - 1]);
    if (shift != 0) {
        for (int i = m - 1; i > 0; --i)
            by.word[i] = by.word[i] << shift | by.word[i - 1] >> (kWordBits - shift);
        by.word[0] <<= shift;
    }
    const int steps = std::max(words + 1, term.length - m + 1);
    uint32_t rest[kMostWords + 5 * kFactorWords]; // the term, padded with zeros and shifted as `by`
    const int length = steps + m - 1;
    const int zeros = length - term.length;
    for (int i = 0; i < zeros; ++i)
        rest[i] = 0;
    uint32_t below = 0;
    for (int i = 0; i < term.length; ++i) {
        rest[zeros + i] = shift == 0 ? term.word[i] : term.word[i] << shift | below;
        below = shift == 0 ? 0 : term.word[i] >> (kWordBits - shift);
    }
    rest[length] = below;
    const uint64_t upper = by.word[m - 1];
    const uint64_t second = m > 1 ? by.word[m - 2] : 0;
    for (int step = steps - 1; step >= 0; --step) {
        uint32_t *at = rest + step;
        const uint64_t lead = static_cast<uint64_t>(at[m]) << kWordBits | at[m - 1];
        uint64_t digit = lead / upper;
        uint64_t left = lead % upper;
        while (digit >> kWordBits != 0 ||
               (m > 1 && digit * second > (left << kWordBits | at[m - 2]))) {
            --digit;
            left += upper;
            if (left >> kWordBits != 0)
                break;
        }
        uint64_t carry = 0;
        uint64_t borrow = 0;
        for (int i = 0; i < m; ++i) {
            carry += digit * by.word[i];
            const uint64_t difference =
                static_cast<uint64_t>(at[i]) - (carry & 0xFFFFFFFFU) - borrow;
            at[i] = static_cast<uint32_t>(difference);
            borrow = difference >> 63;
            carry >>= kWordBits;
        }
        const uint64_t difference = static_cast<uint64_t>(at[m]) - carry - borrow;
        at[m] = static_cast<uint32_t>(difference);
        if (difference >> 63 != 0) { // the digit is one too large
            --digit;
            uint64_t sum = 0;
            for (int i = 0; i < m; ++i) {
                sum += static_cast<uint64_t>(at[i]) + by.word[i];
                at[i] = static_cast<uint32_t>(sum);
                sum >>= kWordBits;
            }
            at[m] += static_cast<uint32_t>(sum);
        }
        term.word[step] = static_cast<uint32_t>(digit);
    }
    term.length = steps;
    term.exponent -= zeros + by.exponent;
    term.trim();
}

// Whether the terms after number k + 1 decrease.
bool Falls(const HyperTerms &t, double k) {
    const bool isPast = t.a.high + k > 0 && (!t.hasB || t.b.high + k > 0) && t.c.high + k > 0;
    const double second = t.hasB ? t.b.high + k : 1;
    return isPast && (t.a.high + k) * second * std::fabs(t.x.high) < (t.c.high + k) * (k + 1);
}

// The sums of the positive and of the negative terms, from a fixed lowest word on.
class Accumulator {
public:
    Accumulator(int words, int exponent) : words_(words), exponent_(exponent) {
        for (auto &part : word_)
            for (int i = 0; i < words; ++i)
                part[i] = 0;
    }
    // Returns false if the term reaches beyond the upper end.
    bool add(const Term &term, bool isNegative) {
        uint32_t *sum = word_[isNegative ? 1 : 0];
        const int offset = term.exponent - exponent_;
        if (offset + term.length >= words_)
            return false;
        uint64_t carry = 0;
        for (int i = std::max(0, offset); i < words_; ++i) {
            const int from = i - offset;
            if (from >= term.length && carry == 0)
                break;
            carry += static_cast<uint64_t>(sum[i]) + (from < term.length ? term.word[from] : 0);
            sum[i] = static_cast<uint32_t>(carry);
            carry >>= kWordBits;
        }
        return true;
    }
    bool isBelow(const Term &term) const { return term.exponent + term.length <= exponent_; }

    // The difference of the two sums, with an error of `units` in the last place.
    Estimated value(double units) const {
        int top = words_ - 1;
        while (top >= 0 && word_[0][top] == word_[1][top])
            --top;
        if (top < 0)
            return {{{0, 0}, 0}, kInfinity};
        const bool isNegative = word_[0][top] < word_[1][top];
        const uint32_t *large = word_[isNegative ? 1 : 0];
        const uint32_t *small = word_[isNegative ? 0 : 1];
        uint32_t difference[kMostWords + kFactorWords];
        uint32_t borrow = 0;
        for (int i = 0; i <= top; ++i) {
            const uint64_t d = static_cast<uint64_t>(large[i]) - small[i] - borrow;
            difference[i] = static_cast<uint32_t>(d);
            borrow = static_cast<uint32_t>(d >> 63);
        }
        while (top > 0 && difference[top] == 0)
            --top;
        Extended sum = {0, 0};
        const int lowest = std::max(0, top - 3);
        for (int i = top; i >= lowest; --i)
            sum = sum +
                  Extended{std::ldexp(static_cast<double>(difference[i]), kWordBits * (i - lowest)),
                           0};
        if (isNegative)
            sum = -sum;
        const Wide value = WideOf(sum, kWordBits * (exponent_ + lowest));
        const double log = value.logarithm() - kWordBits * static_cast<double>(exponent_);
        return {value, std::exp2(std::log2(units) - log) + 0x1p-100};
    }

private:
    uint32_t word_[2][kMostWords + kFactorWords];
    int words_;
    int exponent_;
};

} // namespace

Estimated IntegerSum(const HyperTerms &terms, double largest, int bits) {
    const Estimated none = {{{kNaN, 0}, 0}, kNaN};
    const int words = bits / kWordBits + 2;
    Parameter a, b, c, x;
    if (!(largest < kMostLargest) || words > kMostWords - 4 || !a.set(terms.a) || !c.set(terms.c) ||
        !x.set(terms.x) || (terms.hasB && !b.set(terms.b)))
        return none;
    const int top = static_cast<int>(std::ceil((largest + 1) / kWordBits)) + 1;
    Accumulator sum(words + 3, top - words - 1);
    Term term;
    term.word[0] = 1;
    term.length = 1;
    term.exponent = 0;
    bool isNegative = false;
    Factor argument, factor;
    x.magnitude(argument);
    const int most = static_cast<int>(kMostWork / words);
    for (int k = 0; k < most; ++k) {
        if (!sum.add(term, isNegative))
            return none;
        a.magnitude(factor);
        if (factor.length == 0)
            return sum.value(k + 1.0);
        isNegative = isNegative != (a.isNegative() != c.isNegative());
        Multiply(term, factor);
        term.cut(words + 1);
        if (terms.hasB) {
            b.magnitude(factor);
            if (factor.length == 0)
                return sum.value(k + 1.0);
            isNegative = isNegative != b.isNegative();
            Multiply(term, factor);
            term.cut(words + 1);
            b.increment();
        }
        Multiply(term, argument);
        isNegative = isNegative != x.isNegative();
        c.magnitude(factor);
        if (factor.length == 0)
            return none;
        MultiplyByWord(factor, static_cast<uint32_t>(k) + 1);
        Divide(term, factor, words);
        term.cut(words + 1);
        if (term.length == 0)
            return none;
        if (sum.isBelow(term) && Falls(terms, k))
            return sum.value(8.0 * k + 8 + (terms.hasB ? 1 / (1 - std::fabs(terms.x.high)) : 0));
        a.increment();
        c.increment();
    }
    return none;
}

} // namespace qx

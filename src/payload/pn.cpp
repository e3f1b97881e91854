#include "payload/pn.h"

#include <algorithm>
#include <array>
#include <stdexcept>
#include <string>

namespace Orvalis_NR {

namespace {

// Exponents of the feedback polynomial per degree: x[k] = xor over t of x[k - t].
const std::vector<int>& exponentsOf(int degree) {
    static const std::array<std::vector<int>, 32> table = {{
        {},
        {},
        {},
        {3, 1},
        {4, 1},
        {5, 2},
        {6, 1},
        {7, 1},
        {8, 4, 3, 2},
        {9, 5},
        {10, 3},
        {11, 9},
        {12, 6, 4, 1},
        {13, 4, 3, 1},
        {14, 12, 2, 1},
        {15, 14},
        {16, 12, 3, 1},
        {17, 3},
        {18, 7},
        {19, 5, 2, 1},
        {20, 3},
        {21, 2},
        {22, 1},
        {23, 18},
        {24, 7, 2},
        {25, 3},
        {26, 6, 2, 1},
        {27, 5, 2, 1},
        {28, 3},
        {29, 27},
        {30, 23, 2, 1},
        {31, 28},
    }};
    return table[static_cast<std::size_t>(degree)];
}

int validDegree(int degree) {
    return degree >= 3 && degree <= 31 ? degree : 9;
}

}  // namespace

void PN::setPolynomial(int deg, const std::vector<int>& exponents, std::vector<char>& seed,
                       int skipBits) {
    degree = deg;
    taps.clear();
    for (int t : exponents) {
        if (t < 1 || t > degree)
            throw std::invalid_argument("PN::Init: exponent " + std::to_string(t) + " outside 1.." +
                                        std::to_string(degree));
        taps.push_back(static_cast<char>(degree - t));
    }
    tapCount = static_cast<int>(taps.size());
    inverted = (degree == 15 || degree == 23 || degree == 29 || degree == 31) ? 1 : 0;
    state.assign(static_cast<std::size_t>(degree), 1);
    seed = state;
    skip = skipBits;
    scratch.clear();
    scratchLength = 0;
}

void PN::Init(int degree_, std::vector<char>& seedOut, int skip_) {
    const int d = validDegree(degree_);
    setPolynomial(d, exponentsOf(d), seedOut, skip_);
}

void PN::Init(int degree_, std::vector<char>& seed, std::vector<char> polynomial, int skip_) {
    setPolynomial(validDegree(degree_), std::vector<int>(polynomial.begin(), polynomial.end()),
                  seed, skip_);
}

// x[from..to-1] from the recurrence; x[from - degree .. from - 1] must be there already.
void PN::extend(char* x, long long from, long long to) const {
    if (tapCount == 2) {  // the common two-term case without the inner loop
        const long long a = taps[0] - degree, b = taps[1] - degree;
        for (long long k = from; k < to; ++k) x[k] = static_cast<char>(x[k + a] ^ x[k + b]);
        return;
    }
    for (long long k = from; k < to; ++k) {
        char bit = 0;
        for (int j = 0; j < tapCount; ++j) bit ^= x[k - degree + taps[static_cast<std::size_t>(j)]];
        x[k] = bit;
    }
}

void PN::dropSkippedBits() {
    if (skip <= 0 || degree <= 0) return;
    const long long total = static_cast<long long>(skip) + degree;
    scratch.resize(static_cast<std::size_t>(total));
    std::copy(state.begin(), state.end(), scratch.begin());
    extend(scratch.data(), degree, total);
    std::copy(scratch.end() - degree, scratch.end(), state.begin());
    skip = 0;
}

void PN::Generate(std::vector<char>& bits, int count) {
    if (degree <= 0) throw std::logic_error("PN::Generate: the generator has not been initialised");
    if (count < 0)
        throw std::invalid_argument("PN::Generate: count must not be negative, got " +
                                    std::to_string(count));
    dropSkippedBits();
    if (count < degree) {
        GenerateShort(bits, count);
        return;
    }
    bits.resize(static_cast<std::size_t>(count));
    std::copy(state.begin(), state.end(), bits.begin());
    extend(bits.data(), degree, count);
    // The register after the last bit handed out: x[count .. count + degree - 1].
    scratch.resize(2 * static_cast<std::size_t>(degree));
    std::copy(bits.end() - degree, bits.end(), scratch.begin());
    extend(scratch.data(), degree, 2LL * degree);
    std::copy(scratch.begin() + degree, scratch.end(), state.begin());
    if (inverted)
        for (auto& b : bits) b ^= 1;
}

std::vector<char> PN::Generate(int count) {
    std::vector<char> bits;
    Generate(bits, count);
    return bits;
}

void PN::GenerateShort(std::vector<char>& bits, int count) {
    if (degree <= 0)
        throw std::logic_error("PN::GenerateShort: the generator has not been initialised");
    if (count < 0 || count >= degree)
        throw std::invalid_argument("PN::GenerateShort: count must be 0.." +
                                    std::to_string(degree - 1) + ", got " + std::to_string(count));
    scratchLength = count + degree;
    scratch.resize(static_cast<std::size_t>(scratchLength));
    std::copy(state.begin(), state.end(), scratch.begin());
    extend(scratch.data(), degree, scratchLength);
    bits.assign(scratch.begin(), scratch.begin() + count);
    std::copy(scratch.begin() + count, scratch.begin() + count + degree, state.begin());
}

}  // namespace Orvalis_NR

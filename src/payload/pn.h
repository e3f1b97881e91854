#pragma once
// Linear-feedback pseudo-noise generator behind the PN payloads (PN9 ... PN31). The channel
// scrambling sequences use the Gold sequence of the coding layer instead.

#include <vector>

namespace Orvalis_NR {

class PN {
  public:
    /// degree: 3..31, any other value means 9. Chooses the polynomial of that degree, fills
    /// `seedOut` and `state` with `degree` ones; the first `skip` bits of the next call are
    /// dropped. Degrees 15, 23, 29 and 31 give a complemented output.
    void Init(int degree, std::vector<char>& seedOut, int skip);

    /// The same with the polynomial given as its exponents t (x[k] = xor of x[k - t]), each
    /// in 1..degree (std::invalid_argument otherwise). `seed` is filled with ones.
    void Init(int degree, std::vector<char>& seed, std::vector<char> polynomial, int skip);

    /// `count` bits into `bits` (resized): the register contents, then the recurrence; the
    /// next call goes on without a gap. Complemented when `inverted`. Below `degree` bits the
    /// request goes to GenerateShort, which does not complement.
    void Generate(std::vector<char>& bits, int count);
    std::vector<char> Generate(int count);

    /// `count` (< degree) bits from the register and the recurrence, never complemented.
    void GenerateShort(std::vector<char>& bits, int count);

    int skip = 0;
    std::vector<char> state;
    std::vector<char> taps;
    int degree = 0;
    int tapCount = 0;
    int inverted = 0;
    std::vector<char> scratch;
    int scratchLength = 0;

  private:
    void setPolynomial(int deg, const std::vector<int>& exponents, std::vector<char>& seed,
                       int skipBits);
    void extend(char* x, long long from, long long to) const;
    void dropSkippedBits();
};

}  // namespace Orvalis_NR

#pragma once
// The list-form LDPC encoder: each parity bit is the XOR of the work entries its row lists.

#include <vector>

namespace Orvalis_NR {

class LdpcEncoderCore {
public:
    /// Encodes with the row lists of LdpcParityMatrix::GetNRMatrix. A work vector of `total`
    /// ints starts with in[inStart .. inStart + inCount) and zeros; row i writes the XOR of
    /// the entries it lists to position total - parityCount + i, in row order. The work vector
    /// is then copied to out[outStart ..]. Cost: one read per listed index.
    static void Encode2(std::vector<int>& out, int outStart, std::vector<int> in, int inStart,
                        int inCount, int parityCount, int total,
                        std::vector<std::vector<int>>& rows);
};

}  // namespace Orvalis_NR

#include "coding/ldpc_encoder_core.h"

#include <algorithm>
#include <stdexcept>
#include <string>

namespace Orvalis_NR {

void LdpcEncoderCore::Encode2(std::vector<int>& out, int outStart, std::vector<int> in,
                              int inStart, int inCount, int parityCount, int total,
                              std::vector<std::vector<int>>& rows) {
    const auto fail = [](const std::string& what) {
        throw std::out_of_range("LdpcEncoderCore::Encode2: " + what);
    };
    if (inStart < 0 || inCount < 0 || static_cast<std::size_t>(inStart) + inCount > in.size()) {
        fail("input range " + std::to_string(inStart) + "+" + std::to_string(inCount) +
             " exceeds " + std::to_string(in.size()) + " elements");
    }
    if (parityCount < 0 || total < inCount || total - parityCount < 0 ||
        rows.size() > static_cast<std::size_t>(parityCount)) {
        fail("total " + std::to_string(total) + " cannot hold " + std::to_string(inCount) +
             " inputs and " + std::to_string(rows.size()) + " of " +
             std::to_string(parityCount) + " parity rows");
    }
    if (outStart < 0 || static_cast<std::size_t>(outStart) + total > out.size()) {
        fail("output of " + std::to_string(out.size()) + " elements cannot take " +
             std::to_string(total) + " from " + std::to_string(outStart));
    }

    std::vector<int> work(static_cast<std::size_t>(total), 0);
    std::copy_n(in.begin() + inStart, inCount, work.begin());
    const std::size_t parityBase = static_cast<std::size_t>(total - parityCount);
    for (std::size_t i = 0; i < rows.size(); ++i) {
        int value = 0;
        for (int index : rows[i]) {
            if (index < 0 || index >= total) {
                fail("row " + std::to_string(i) + " lists column " + std::to_string(index));
            }
            value ^= work[static_cast<std::size_t>(index)];
        }
        work[parityBase + i] = value;
    }
    std::copy(work.begin(), work.end(), out.begin() + outStart);
}

}  // namespace Orvalis_NR

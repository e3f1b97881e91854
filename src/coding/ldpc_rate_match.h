#pragma once
// LDPC rate matching of one code block, TS 38.212 clause 5.4.2: bit selection from the
// circular buffer (5.4.2.1) and bit interleaving (5.4.2.2).

#include <string>
#include <vector>

#include "coding/coding_types.h"

namespace Orvalis_NR {

class LDPC_RateMatch {
public:
    int Blocks = 0;  // C
    int E = 0;       // output bits of this block
    int N = 0;       // encoder output length
    int K0 = 0;      // start in the circular buffer
    int Ncb = 0;     // circular buffer length, <= N
    int Qm = 0;      // modulation order
    std::string ErrorMessage;

    /// rv: 0..3 ("RV is out of range."); qm: 1, 2, 4, 6 or 8 ("Qm should be 1, 2, 4, 6 or
    /// 8."). A refused value leaves K0 and Qm as they were. K0 per TS 38.212 Table 5.4.2.1-2.
    bool Initialize(LDPC_BaseGraphTypeEnumList baseGraph, int z, int blocks, int ncb, int n,
                    int e, int rv, int qm);

    /// d: N encoder outputs, -2 for a filler (skipped); f: E outputs. Reads d cyclically over
    /// its first Ncb elements from K0. When Qm does not divide E the last E mod Qm elements of
    /// f keep their content.
    bool Run(std::vector<int>& d, std::vector<int>& f);

    /// The same selection and interleaving over arrays of at least Ncb and E elements, with
    /// -1 marking a position to skip.
    bool GetPattern(const int* d, int* f);

private:
    std::vector<int> Selected;  // e of clause 5.4.2.1 before interleaving
    void selectAndInterleave(const int* d, int skip, int* f);
};

}  // namespace Orvalis_NR

#pragma once
// Parity-check matrices of the NR LDPC base graphs (TS 38.212 clause 5.3.2) in the forms the
// encoders use: the shift form of the base graph, its sparse lifting, and the dense lifting.

#include <vector>

namespace Orvalis_NR {

class LdpcParityMatrix {
public:
    /// Shift form of a base graph: 46 x 68 (baseGraph 0, graph 1) or 42 x 52 (baseGraph 1,
    /// graph 2); each position holds V_ij mod z, or -1 where the graph has no entry.
    /// setIndex: 1..8 (iLS + 1); z: a lifting size, 2..384.
    static void GetBaseMatrix(int baseGraph, int setIndex, int z,
                              std::vector<std::vector<int>>& base);

    /// Sparse lifted parity checks brought into the order Encode2 solves: one vector of column
    /// indices per lifted row (rows x z rows), after sortToLT2 with the set's head correction.
    static void GetNRMatrix(int baseGraph, int setIndex, int z,
                            std::vector<std::vector<int>>& rows);

    /// Dense lifting of a shift-form base matrix: h gets rows*z rows of columns*z entries, 1 at
    /// row b*z + r, column c*z + (V + r) mod z for every V >= 0 at base position (b, c).
    static void inflate(std::vector<std::vector<int>> base, std::vector<std::vector<int>>& h,
                        int z);

    /// Turns the double-diagonal head (the first four row blocks) into rows that are solved in
    /// order: block b becomes the sum of blocks b..3, and with shift != 0 the rows of block 0
    /// are rotated so that row r yields parity bit r of the first parity block.
    static void sortToLT2(std::vector<std::vector<int>>& rows, int z, int shift);
};

}  // namespace Orvalis_NR

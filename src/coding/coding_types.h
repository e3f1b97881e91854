#pragma once
// Bit and sample types shared by the coding primitives and the channels that call them.
//
// The free functions of the coding layer (NR_CRC, PN_Generator, GetConstellation, ...) live in
// the global namespace, so these names do too; they are visible unqualified inside Orvalis_NR.

#include <complex>
#include <vector>

/// One bit per element, values 0 and 1 (some callers store +1/-1 or placeholders -1/-2).
using BitSequence = std::vector<char>;

/// All signal arithmetic is complex double.
using complex = std::complex<double>;

/// CRC polynomial selector, TS 38.212 clause 5.1. Any value outside 0..5 acts as CRC_24A.
enum CRC_LengthEnumList : int {
    CRC_24A = 0,  ///< gCRC24A, transport blocks above 3824 bits
    CRC_24B = 1,  ///< gCRC24B, code blocks
    CRC_24C = 2,  ///< gCRC24C, PBCH and DCI
    CRC_16 = 3,   ///< gCRC16, small transport blocks
    CRC_11 = 4,   ///< gCRC11, UCI
    CRC_6 = 5,    ///< gCRC6, short UCI
};

/// LDPC base graph selector, TS 38.212 clause 5.3.2: 0 is base graph 1, any other value graph 2.
enum LDPC_BaseGraphTypeEnumList : int {
    LDPC_BG1 = 0,
    LDPC_BG2 = 1,
};

/// Cyclic prefix of a numerology, TS 38.211 clause 5.3.1.
enum CP_TypeEnumList : int {
    CP_Normal = 0,
    CP_Extended = 1,
};

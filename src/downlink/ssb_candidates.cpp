#include "downlink/ssb_candidates.h"

#include <initializer_list>

namespace {

/// Every base + step n for n in 0..count-1; with `skipFifth` the n with n mod 5 == 4 are left
/// out (n = 4, 9, 14 of the 120 kHz pattern, n = 4 of the 240 kHz pattern).
std::vector<int> groups(std::initializer_list<int> base, int step, int count, bool skipFifth) {
    std::vector<int> symbols;
    for (int n = 0; n < count; ++n) {
        if (skipFifth && n % 5 == 4) continue;
        for (int b : base) symbols.push_back(b + step * n);
    }
    return symbols;
}

}  // namespace

std::vector<int> GetSSBCandidateSymbols(int mu, int ssb30kOption) {
    switch (mu) {
        case 0:  // Case A: {2, 8} + 14n, n = 0..3
            return groups({2, 8}, 14, 4, false);
        case 1:
            if (ssb30kOption == SSOption30K_Option1) return groups({2, 8}, 14, 4, false);  // Case C
            return groups({4, 8, 16, 20}, 28, 2, false);                                   // Case B
        case 3:  // Case D: {4, 8, 16, 20} + 28n, n = 0..18 without 4, 9, 14
            return groups({4, 8, 16, 20}, 28, 19, true);
        case 4:  // Case E: {8, 12, 16, 20, 32, 36, 40, 44} + 56n, n = 0..8 without 4
            return groups({8, 12, 16, 20, 32, 36, 40, 44}, 56, 9, true);
        default:
            return {};
    }
}

bool Gen_SSflag_HalfFrame(int lmax, int scs, SSOption30K_EnumList option, CP_TypeEnumList cp,
                          BitSequence& flags) {
    bool known = false;
    if (scs == 0) known = lmax == 4 || lmax == 8;
    if (scs == 1)
        known = (lmax == 4 || lmax == 8) &&
                (option == SSOption30K_Option0 || option == SSOption30K_Option1);
    if (scs == 3 || scs == 4) known = lmax == 64;
    if (!known) return false;

    const int slotsPerFrame = 10 << scs;
    const int symbolsPerSlot = cp == CP_Extended ? 12 : 14;
    flags.assign(static_cast<std::size_t>(slotsPerFrame * symbolsPerSlot / 2), 0);
    const std::vector<int> candidates = GetSSBCandidateSymbols(scs, option);
    for (int i = 0; i < lmax; ++i) {
        const int symbol = candidates[static_cast<std::size_t>(i)];
        // Extended prefix has fewer symbols per half frame than the 120 kHz pattern reaches.
        if (symbol < 0 || static_cast<std::size_t>(symbol) >= flags.size()) return false;
        flags[static_cast<std::size_t>(symbol)] = 1;
    }
    return true;
}

#include "coding/base_sequences.h"

#include <fftw3.h>

#include <cmath>
#include <map>
#include <memory>
#include <numbers>
#include <stdexcept>
#include <string>

#include "coding/constellation.h"
#include "coding/gold_sequence.h"
#include "coding/table_edition.h"
#include "tables/base_sequence_tables.h"

namespace {

namespace tables = Orvalis_NR::tables;
constexpr double kPi = std::numbers::pi;

void checkLength(const char* function, int M) {
    if (M < 0)
        throw std::invalid_argument(std::string(function) + ": M must not be negative, got " +
                                    std::to_string(M));
}

void checkGroup(const char* function, int u) {
    if (u < 0 || u > 29)
        throw std::out_of_range(std::string(function) + ": u must be 0..29, got " +
                                std::to_string(u));
}

// Row u of a 30-row table as a pointer to its M entries.
template <typename Table>
const auto* rowOf(const Table& table, int u) {
    return table[static_cast<std::size_t>(u)].data();
}

// Phase table of the type-1 sequences of length 6, 12, 18, 24 in the edition in force.
const std::int8_t* type1Row(int M, int u) {
    const bool firstEdition = Orvalis_NR::specVersion == 151;
    switch (M) {
        case 6:
            return rowOf(tables::kLowPaprType1Len6, u);
        case 12:
            return firstEdition ? rowOf(tables::kLowPaprType1Len12FirstEdition, u)
                                : rowOf(tables::kLowPaprType1Len12, u);
        case 18:
            return firstEdition ? rowOf(tables::kLowPaprType1Len18FirstEdition, u)
                                : rowOf(tables::kLowPaprType1Len18, u);
        default:
            return firstEdition ? rowOf(tables::kLowPaprType1Len24FirstEdition, u)
                                : rowOf(tables::kLowPaprType1Len24, u);
    }
}

// Largest prime strictly below M (M >= 36), by trial division up to floor(sqrt(x)).
int largestPrimeBelow(int M) {
    for (int x = M - 1; x > 2; --x) {
        bool prime = true;
        for (int d = 2; d * d <= x; ++d)
            if (x % d == 0) {
                prime = false;
                break;
            }
        if (prime) return x;
    }
    return 2;
}

// q of TS 38.211 clause 5.2.2.1: q-bar = (u+1) N / 31, q = floor(q-bar + 1/2) + v (-1)^floor(2
// q-bar).
int rootIndex(int u, int v, int N) {
    const double qBar = static_cast<double>(u + 1) * N / 31.0;
    const long long parity = static_cast<long long>(std::floor(2.0 * qBar));
    return static_cast<int>(std::floor(qBar + 0.5)) + v * (parity % 2 == 0 ? 1 : -1);
}

// Forward transforms of the type-2 sequences, one FFTW plan per length, made at first use and
// kept for the life of the process (the library runs on one thread).
class DftPlans {
  public:
    // out(k) = sum over n of in(n) exp(-j 2 pi k n / M), unscaled.
    void forward(const std::vector<complex>& in, std::vector<complex>& out) {
        const int M = static_cast<int>(in.size());
        Plan& plan = plans_[M];
        if (!plan.plan) plan.make(M);
        std::copy(in.begin(), in.end(), reinterpret_cast<complex*>(plan.in));
        fftw_execute(plan.plan);
        const complex* result = reinterpret_cast<const complex*>(plan.out);
        out.assign(result, result + M);
    }

  private:
    struct Plan {
        fftw_complex* in = nullptr;
        fftw_complex* out = nullptr;
        fftw_plan plan = nullptr;
        void make(int M) {
            in = fftw_alloc_complex(static_cast<std::size_t>(M));
            out = fftw_alloc_complex(static_cast<std::size_t>(M));
            plan = fftw_plan_dft_1d(M, in, out, FFTW_FORWARD, FFTW_ESTIMATE);
            if (!in || !out || !plan)
                throw std::runtime_error("LowPapr2SequenceGenerate: no DFT plan of size " +
                                         std::to_string(M));
        }
        Plan() = default;
        Plan(const Plan&) = delete;
        Plan& operator=(const Plan&) = delete;
        ~Plan() {
            if (plan) fftw_destroy_plan(plan);
            fftw_free(in);
            fftw_free(out);
        }
    };
    std::map<int, Plan> plans_;
};

DftPlans& dftPlans() {
    static DftPlans plans;
    return plans;
}

}  // namespace

void LowPaprSequenceGenerate(std::vector<complex>& r, int M, double alpha, int /*reserved*/, int u,
                             int v) {
    checkLength("LowPaprSequenceGenerate", M);
    r.resize(static_cast<std::size_t>(M));
    auto put = [&r](int n, double theta) {
        r[static_cast<std::size_t>(n)] = complex(std::cos(theta), std::sin(theta));
    };
    if (M == 6 || M == 12 || M == 18 || M == 24) {
        checkGroup("LowPaprSequenceGenerate", u);
        const std::int8_t* phi = type1Row(M, u);
        for (int n = 0; n < M; ++n) put(n, n * alpha + phi[n] * kPi / 4);
    } else if (M == 30) {
        // Clause 5.2.2.2, length 30: the division by 31 comes last.
        for (int n = 0; n < M; ++n) put(n, n * alpha - kPi * (u + 1) * (n + 1) * (n + 2) / 31);
    } else if (M < 36) {
        for (int n = 0; n < M; ++n) put(n, n * alpha);
    } else {
        const int N = largestPrimeBelow(M);
        const long long q = rootIndex(u, v, N);
        for (int n = 0; n < M; ++n) {
            const long long m = n % N;
            put(n, n * alpha - static_cast<double>(m * q) * kPi * static_cast<double>(m + 1) / N);
        }
    }
}

void LowPapr2SequenceGenerate(std::vector<complex>& r, int M, double /*alpha*/, int /*reserved*/,
                              int u, int /*v*/, int cInit) {
    checkLength("LowPapr2SequenceGenerate", M);
    std::vector<complex> x(static_cast<std::size_t>(M));
    auto halfPi = [&x](BitSequence bits) { HalfPiBPSK(bits, x); };
    if (M == 6) {
        checkGroup("LowPapr2SequenceGenerate", u);
        const std::int8_t* phi = rowOf(tables::kLowPaprType2Len6, u);
        for (int n = 0; n < M; ++n)
            x[static_cast<std::size_t>(n)] = std::exp(complex(0, kPi * phi[n] / 8));
    } else if (M == 12 || M == 18 || M == 24) {
        checkGroup("LowPapr2SequenceGenerate", u);
        const std::int8_t* b = M == 12   ? rowOf(tables::kLowPaprType2Len12, u)
                               : M == 18 ? rowOf(tables::kLowPaprType2Len18, u)
                                         : rowOf(tables::kLowPaprType2Len24, u);
        halfPi(BitSequence(b, b + M));
    } else if (M >= 30) {
        BitSequence bits(static_cast<std::size_t>(M));
        PN_Generator(bits, M, cInit);
        halfPi(std::move(bits));
    }
    if (M == 0) {
        r.clear();
        return;
    }
    dftPlans().forward(x, r);
    const double scale = 1.0 / std::sqrt(static_cast<double>(M));
    for (auto& value : r) value *= scale;
}

void ZC_Generator(std::vector<complex>& r, int M, int k, int u, int v, double alpha, double delta) {
    checkLength("ZC_Generator", M);
    if (M > tables::kZadoffChuPrimes.back())
        throw std::out_of_range("ZC_Generator: M must not exceed 1249, got " + std::to_string(M));
    const double s = (k % 2) * delta * 0.5;
    // The entry before the first prime (from the second on) that is at or above M.
    std::size_t i = 1;
    while (tables::kZadoffChuPrimes[i] < M) ++i;
    const int N = tables::kZadoffChuPrimes[i - 1];

    r.assign(static_cast<std::size_t>(M), complex(0, 0));
    auto turn = [&](int n) { return std::exp(complex(0, (n + s) * alpha)); };
    if (M == 12 || M == 24) {
        checkGroup("ZC_Generator", u);
        for (int n = 0; n < M; ++n) {
            const double phi =
                M == 12 ? tables::kLowPaprType1Len12FirstEdition[static_cast<std::size_t>(u)]
                                                                [static_cast<std::size_t>(n)]
                        : tables::kZadoffChuLen24[static_cast<std::size_t>(u)]
                                                 [static_cast<std::size_t>(n)];
            r[static_cast<std::size_t>(n)] = std::exp(complex(0, phi * kPi / 4)) * turn(n);
        }
    } else if (M >= 36) {
        const double q = rootIndex(u, v, N);
        for (int n = 0; n < M; ++n) {
            const double m = n % N;
            r[static_cast<std::size_t>(n)] =
                std::exp(complex(0, -kPi * q * m * (m + 1) / N)) * turn(n);
        }
    }
}

bool IsPrime(int x) {
    if (x < 2) return false;
    if (x == 2) return true;
    const int limit = static_cast<int>(std::floor(std::sqrt(static_cast<double>(x))));
    for (int d = 2; d < limit; ++d)
        if (x % d == 0) return false;
    return true;
}

#pragma once
// OFDM modulation of one radio frame (TS 38.211 clause 5.3.1): per symbol an inverse transform,
// the phase compensation of clause 5.4, the cyclic prefix, and a raised-cosine crossfade with the
// previous symbol's cyclic continuation.

#include <complex>
#include <string>
#include <vector>

#include "dsp/fft.h"
#include "dsp/slot_grid.h"

namespace Orvalis_NR {

class OfdmModulator {
  public:
    OfdmModulator();

    /// fftSize: >= 1 (the crossfade reads circularly only for powers of two);
    /// cpLengths: >= 1 entries, applied cyclically over symbols and carried on over antennas;
    /// symbolCount: symbols per call; numberOfAntennas: rows per call.
    /// Set windowLength (0 .. fftSize) and centred before. Always true.
    bool Init(int fftSize, std::vector<int> cpLengths, int symbolCount, bool dcPunctured,
              int numberOfAntennas);

    /// Modulates symbolCount symbols of each antenna's `grid` row into the `output` row of the
    /// same antenna, from its start. phaseStep: radians per sample of the compensation
    /// frequency, 0 for none; frame: index of the frame in the waveform.
    /// Returns false, and touches nothing when `output` has not numberOfAntennas rows.
    bool Go(SlotGrid& grid, std::vector<std::vector<std::complex<double>>>& output,
            double phaseStep, int frame);

    std::string name;
    int windowLength = 0;
    int centred = 1;
    int oversampling = 1;
    int fftSize = 0;
    std::vector<int> cpLengths;
    int maxSymbolLength = 0;
    int symbolCount = 0;
    int symbolLoopCount = 0;  // loop bounds: symbols, then two nested counts that stay 1
    int innerLoopCount = 1;
    int innermostLoopCount = 1;
    int numberOfAntennas = 0;
    std::vector<std::complex<double>> work;
    std::vector<std::vector<std::complex<double>>> tails;
    std::vector<double> window;
    FFT fft;
    DFT dft;
    bool dcPunctured = false;

  private:
    void checkBuffers(const SlotGrid& grid,
                      const std::vector<std::vector<std::complex<double>>>& output) const;
    /// Writes the symbol in `work` times `factor` (the 1/N of the inverse transform, with the
    /// phase compensation when there is one) while copying it out.
    template <class Factor>
    void writeSymbol(std::complex<double>* out, std::vector<std::complex<double>>& tail, int cp, Factor factor);
};

}  // namespace Orvalis_NR

#pragma once
// Settings and frame stores for the SS/PBCH generator tests.

#include <complex>
#include <memory>
#include <string>
#include <vector>

#include "downlink/pbch_generator.h"
#include "dsp/slot_grid.h"
#include "models/nr_carrier.h"
#include "models/nr_sspbch.h"

namespace ssb_test {

using Models::Nr5g::SSBPeriod;

/// An NRSSPBCH item with its carrier, set up for one test.
struct SsbItem {
    std::shared_ptr<Models::Nr5g::NRSSPBCH> ssb = std::make_shared<Models::Nr5g::NRSSPBCH>();
    std::shared_ptr<Models::Nr5g::NRCarrier> carrier = std::make_shared<Models::Nr5g::NRCarrier>();

    SsbItem(int mu, int lmax, SSBPeriod period = SSBPeriod::OneFrame,
            const std::string& levels = "1", int cellId = 0) {
        ssb->Mu->setValue(mu);
        ssb->Lmax->setValue(lmax);
        ssb->SSBPeriod->setValue(period);
        ssb->PowerLevelStr->setValue(levels);
        carrier->CellID->setValue(cellId);
    }

    /// Init of a fresh generator; the result of Init is kept in `initResult`.
    std::unique_ptr<Orvalis_NR::PBCH_Generator> make(int gridWidth) {
        auto generator = std::make_unique<Orvalis_NR::PBCH_Generator>();
        initResult = generator->Init(ssb.get(), carrier.get(), gridWidth);
        return generator;
    }
    bool initResult = false;
};

/// The frame store of one numerology, zeroed.
struct Store {
    Orvalis_NR::SlotGrid grid;
    Orvalis_NR::OccupancyGrid occupancy;
    Orvalis_NR::OccupancyGrid flags;
    int width = 0;
    int symbols = 0;

    Store(int mu, int fftSize, int antennas = 1, bool extendedCp = false)
        : width(fftSize), symbols((extendedCp ? 120 : 140) << mu) {
        const std::size_t size = static_cast<std::size_t>(symbols) * width;
        grid.assign(antennas, std::vector<std::complex<double>>(size));
        occupancy.assign(antennas, std::vector<int>(size, 0));
        flags.assign(antennas, std::vector<int>(static_cast<std::size_t>(symbols), 0));
    }

    std::size_t at(int symbol, int subcarrier) const {
        const int c = subcarrier < 0 ? subcarrier + width : subcarrier;
        return static_cast<std::size_t>(symbol) * width + c;
    }
};

}  // namespace ssb_test

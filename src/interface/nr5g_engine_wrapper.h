#pragma once
// The engine for object-oriented hosts: the same operations as the plain functions, without
// status word or log. Failures are thrown to the caller.

#include <memory>
#include <string>

#include "models/nr5g_waveform_settings.h"

namespace Orvalis_NR {

class NR5GEngineWrapper {
public:
    NR5GEngineWrapper();
    virtual ~NR5GEngineWrapper();

    /// The wrapper keeps the tree alive until the next Init. Go fails when the tree no longer has
    /// the carriers or antennas that Init saw.
    void Init(std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings, std::string outputPath);
    void InitTestVectorGenerator(bool enable, std::string exportFolder);
    void Go();
    void Cancel();

private:
    class PRIV_NR5GEngineWrapper;
    std::unique_ptr<PRIV_NR5GEngineWrapper> priv;
};

}  // namespace Orvalis_NR

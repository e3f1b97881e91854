#include "interface/nr5g_engine_wrapper.h"

#include "common/failure.h"
#include "engine/nr5g_engine.h"

namespace Orvalis_NR {

class NR5GEngineWrapper::PRIV_NR5GEngineWrapper {
public:
    virtual ~PRIV_NR5GEngineWrapper() = default;
    std::unique_ptr<NR5GEngine> engine = std::make_unique<NR5GEngine>();
    // The tree the engine points into, kept alive until the next Init or the wrapper's end.
    std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings;
};

NR5GEngineWrapper::NR5GEngineWrapper() : priv(std::make_unique<PRIV_NR5GEngineWrapper>()) {}
NR5GEngineWrapper::~NR5GEngineWrapper() = default;

void NR5GEngineWrapper::Init(std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings, std::string outputPath) {
    if (!settings) failWith("NR5GEngineWrapper::Init needs a settings tree.", "settings is empty");
    priv->settings = settings;
    priv->engine->Init(*settings, outputPath.c_str());
}

void NR5GEngineWrapper::InitTestVectorGenerator(bool enable, std::string exportFolder) {
    priv->engine->InitTestvectorGenerator(enable, exportFolder.data());
}

void NR5GEngineWrapper::Go() { priv->engine->Go(); }

void NR5GEngineWrapper::Cancel() { priv->engine->Cancel(); }

}  // namespace Orvalis_NR

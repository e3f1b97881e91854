#include "interface/nr5g_engine_wrapper.h"

#include <stdexcept>

#include "engine/nr5g_engine.h"

namespace Orvalis_NR {

class NR5GEngineWrapper::PRIV_NR5GEngineWrapper {
public:
    virtual ~PRIV_NR5GEngineWrapper() = default;
    std::unique_ptr<NR5GEngine> engine = std::make_unique<NR5GEngine>();
};

NR5GEngineWrapper::NR5GEngineWrapper() : priv(std::make_unique<PRIV_NR5GEngineWrapper>()) {}
NR5GEngineWrapper::~NR5GEngineWrapper() = default;

void NR5GEngineWrapper::Init(std::shared_ptr<Models::Nr5g::NR5GWaveformSettings> settings, std::string outputPath) {
    if (!settings) throw std::invalid_argument("NR5GEngineWrapper::Init: settings is empty");
    priv->engine->Init(*settings, outputPath.c_str());
}

void NR5GEngineWrapper::InitTestVectorGenerator(bool enable, std::string exportFolder) {
    priv->engine->InitTestvectorGenerator(enable, exportFolder.data());
}

void NR5GEngineWrapper::Go() { priv->engine->Go(); }

void NR5GEngineWrapper::Cancel() { priv->engine->Cancel(); }

}  // namespace Orvalis_NR

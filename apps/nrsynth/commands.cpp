#include "commands.h"

#include <fstream>
#include <iostream>
#include <sstream>
#include <stdexcept>

#include "framework/json_serializer.h"
#include "framework/model_container.h"
#include "models/all_models.h"
#include "validation/document_check.h"

namespace nrsynth_cli {

using Orvalis::Tessaline::JsonSerializer;
using Orvalis::Tessaline::ModelContainer;
using Orvalis::Tessaline::Prototype;

std::string readTextFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) throw std::runtime_error("cannot open " + path);
    std::ostringstream text;
    text << in.rdbuf();
    if (in.bad()) throw std::runtime_error("cannot read " + path);
    return text.str();
}

int showDocument(const std::string& path) {
    try {
        JsonSerializer reader;
        auto root = reader.deserialize(readTextFile(path));
        std::cout << JsonSerializer::serialize(*root) << "\n";
        return 0;
    } catch (const std::exception& e) {
        std::cerr << "nrsynth show: " << e.what() << "\n";
        return 1;
    }
}

int showDefaults(const std::string& typeName) {
    const auto* entry = Prototype::getInstance<ModelContainer>()->findByName(typeName);
    if (!entry) {
        std::cerr << "nrsynth show: unknown model type \"" << typeName << "\"; known types:\n";
        for (const auto& name : Prototype::getInstance<ModelContainer>()->typeNames())
            std::cerr << "  " << name << "\n";
        return 1;
    }
    std::cout << JsonSerializer::serialize(*entry->prototype->create()) << "\n";
    return 0;
}

int validateDocument(const std::string& path) {
    try {
        const auto check = validation::checkDocument(readTextFile(path));
        validation::printDocumentCheck(std::cout, path, check);
        return check.errorCount() == 0 ? 0 : 1;
    } catch (const std::exception& e) {
        std::cerr << "nrsynth validate: " << path << ": " << e.what() << "\n";
        return 1;
    }
}

}  // namespace nrsynth_cli

#include "commands.h"

#include <fstream>
#include <iostream>
#include <sstream>
#include <stdexcept>

#include "framework/json_serializer.h"
#include "host/derived_values.h"
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

CompletedText completedDocumentText(const std::string& path, const std::string& command) {
    const std::string text = readTextFile(path);
    const auto document = nlohmann::ordered_json::parse(text, nullptr, false);
    // Text that is not JSON goes to the library as it stands: its reader names the fault.
    if (document.is_discarded() || !document.is_object()) return {text, 0, 0};
    const auto completion = nrsynth_host::completeDocument(document);
    for (const auto& problem : completion.problems)
        std::cerr << command << ": " << path << ": cannot work out " << problem << "\n";
    return {completion.document.dump(1), static_cast<int>(completion.derived.size()),
            static_cast<int>(completion.problems.size())};
}

int showDerivedDocument(const std::string& path) {
    try {
        const auto completed = completedDocumentText(path, "nrsynth show");
        std::cout << completed.text << "\n";
        std::cerr << "nrsynth show: " << completed.derived << " value(s) worked out\n";
        return completed.problems == 0 ? 0 : 1;
    } catch (const std::exception& e) {
        std::cerr << "nrsynth show: " << path << ": " << e.what() << "\n";
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
        // The checks see what `generate` hands the library: the document with its host values
        // worked out. One the reader cannot take is checked as it stands, to name its faults.
        std::string text = readTextFile(path);
        std::vector<std::string> notWorkedOut;
        const auto document = nlohmann::ordered_json::parse(text, nullptr, false);
        if (document.is_object()) {
            try {
                auto completion = nrsynth_host::completeDocument(document);
                text = completion.document.dump();
                notWorkedOut = std::move(completion.problems);
            } catch (const std::exception&) {
            }
        }
        auto check = validation::checkDocument(text);
        for (const auto& problem : notWorkedOut) check.readerProblems.push_back("cannot work out " + problem);
        validation::printDocumentCheck(std::cout, path, check);
        return check.errorCount() == 0 ? 0 : 1;
    } catch (const std::exception& e) {
        std::cerr << "nrsynth validate: " << path << ": " << e.what() << "\n";
        return 1;
    }
}

}  // namespace nrsynth_cli

#pragma once
// Diagnostic export of intermediate data: after frame 0 of a carrier has been computed, every
// channel's stages (bits before and after CRC, coded and rate-matched bits, modulated symbols,
// DM-RS) and the frame after multiplexing and after the cyclic prefix go to text files, so that
// the physical-layer chain can be compared with an outside reference.

#include <complex>
#include <string>
#include <vector>

namespace Orvalis_NR {

class NR5GEngine;
class NR5GNumerologyGenerator;

class TestVectorGenerator {
public:
    NR5GEngine* engine = nullptr;  ///< not owned
    std::string baseFolder;        ///< the folder given, ending in one separator
    std::string outputFolder;      ///< baseFolder + "Intermediate Data" + separator
    int numberOfAntennas = 0;

    /// Keeps the engine and works out the folders. Nothing is created: a folder that is not
    /// there makes every file of the export silently absent.
    void Init(NR5GEngine* engine, std::string folder);
    /// Writes the stages the generators of carrier `carrierIndex` hold for frame `frame`.
    void GenerateOneFrame(int carrierIndex, int frame);

    /// One decimal integer per line (a char is written as its number).
    void SaveBuffer(std::vector<char>& data, std::string fileName);
    void SaveBuffer(std::vector<int>& data, std::string fileName);
    /// One sample per line, "%0.6g %0.6g", with "0 0" for an exact zero.
    void SaveBuffer(std::vector<std::complex<double>>& data, std::string fileName);

private:
    void exportDownlink(NR5GNumerologyGenerator& numerology, const std::string& direction);
    void exportFrame(NR5GNumerologyGenerator& numerology, const std::string& direction);
};

}  // namespace Orvalis_NR

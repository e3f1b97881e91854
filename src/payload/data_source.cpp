#include "payload/data_source.h"

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include "common/packed_bits.h"

namespace Orvalis_NR {

namespace {

constexpr int kPn23Length = 0x7fffff;

// Element value as handed out: the int form sign-extends the stored byte.
template <typename T>
T element(char bit) {
    return static_cast<T>(static_cast<signed char>(bit));
}

std::string readWholeFile(const std::string& fileName) {
    std::ifstream in(fileName, std::ios::binary);
    if (!in || std::filesystem::is_directory(fileName))
        throw std::runtime_error("Payload user file \"" + fileName + "\" cannot be opened");
    std::string content((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (in.bad()) throw std::runtime_error("Payload user file \"" + fileName + "\" cannot be read");
    return content;
}

int hexValue(char ch) {
    if (ch >= '0' && ch <= '9') return ch - '0';
    if (ch >= 'a' && ch <= 'f') return ch - 'a' + 10;
    if (ch >= 'A' && ch <= 'F') return ch - 'A' + 10;
    return 0;
}

bool endsWith(const std::string& text, const std::string& tail) {
    return text.size() >= tail.size() &&
           text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

}  // namespace

std::vector<char> StoredPnSequence(int degree, int bitCount) {
    PN pn;
    std::vector<char> seed;
    pn.Init(degree, seed, 0);
    return pn.Generate(bitCount);
}

std::vector<char> PatternToBits(const std::string& pattern) {
    std::vector<char> bits;
    if (pattern.rfind("PN23", 0) != 0) {
        bits.reserve(pattern.size());
        for (char ch : pattern) bits.push_back(static_cast<char>(ch - '0'));
        return bits;
    }
    // Numbers after the first '(', each ended by ')', ',' or ':'; other characters but digits
    // are skipped, so "PN23(0:99, 200:299)" reads 0, 99, 200, 299.
    std::vector<int> numbers;
    const auto open = pattern.find('(');
    if (open != std::string::npos) {
        std::string digits;
        for (std::size_t i = open + 1; i < pattern.size(); ++i) {
            const char ch = pattern[i];
            if (ch == ')' || ch == ',' || ch == ':') {
                try {
                    numbers.push_back(std::stoi(digits));
                } catch (const std::logic_error&) {
                    throw std::invalid_argument("pattern \"" + pattern + "\": a bit index is missing or too large");
                }
                digits.clear();
            } else if (std::isdigit(static_cast<unsigned char>(ch))) {
                digits += ch;
            }
        }
    }
    if (numbers.size() < 2) return bits;
    const std::vector<char> pn23 = StoredPnSequence(23, kPn23Length);
    // A payload block is indexed by int; far below that, a block this long is a mistake.
    constexpr long long kMaxPatternBits = 1LL << 28;
    long long total = 0;
    for (std::size_t p = 0; p + 1 < numbers.size(); p += 2) {
        const long long a = std::max(numbers[p], 0), b = std::max(numbers[p + 1], 0);
        total += std::max(b - a + 1, 0LL);
        if (total > kMaxPatternBits)
            throw std::invalid_argument("pattern \"" + pattern + "\": the pieces hold more than " +
                                        std::to_string(kMaxPatternBits) + " bits");
        for (long long i = a; i <= b; ++i)
            bits.push_back(pn23[static_cast<std::size_t>(i % kPn23Length)]);
    }
    return bits;
}

std::vector<char> UserFileToBits(const std::string& fileName) {
    const std::string content = readWholeFile(fileName);
    std::vector<char> bits;
    if (endsWith(fileName, ".txt") || endsWith(fileName, ".csv")) {
        if (!content.empty() && (content[0] == 'X' || content[0] == 'x')) {
            bits.reserve(4 * (content.size() - 1));
            for (std::size_t i = 1; i < content.size(); ++i) {
                const int v = hexValue(content[i]);
                for (int k = 3; k >= 0; --k) bits.push_back(static_cast<char>((v >> k) & 1));
            }
        } else {
            bits.reserve(content.size());
            for (char ch : content) bits.push_back(ch == '0' ? 0 : 1);
        }
    } else {
        bits.reserve(8 * content.size());
        for (unsigned char byte : content)
            for (int k = 7; k >= 0; --k) bits.push_back(static_cast<char>((byte >> k) & 1));
    }
    return bits;
}

void DataSourceBlock::Init(std::shared_ptr<Models::Nr5g::PayloadData> payload) {
    if (!payload) throw std::invalid_argument("DataSourceBlock::Init: payload is null");
    using Models::Nr5g::PayloadDataType;
    switch (payload->PayLoadDataType->getValue()) {
        case PayloadDataType::PN9:
            Init(StoredPnSequence(9, 511));
            break;
        case PayloadDataType::PN15:
            Init(StoredPnSequence(15, 32767));
            break;
        case PayloadDataType::PN23:
            Init(StoredPnSequence(23, kPn23Length));
            break;
        case PayloadDataType::PN31: {
            // 2^31 - 1 bits would take 2 GB; the generator runs instead.
            block.clear();
            generating = true;
            std::vector<char> seed;
            generator.Init(31, seed, 0);
            length = 0x7fffffff;
            position = 0;
            break;
        }
        case PayloadDataType::Pattern:
            Init(PatternToBits(payload->PatternBits->getValue()));
            break;
        case PayloadDataType::UserFile:
            Init(UserFileToBits(payload->UserFile->getValue()));
            break;
    }
}

void DataSourceBlock::Init(std::vector<char> bits) {
    block = std::move(bits);
    length = static_cast<int>(block.size());
    position = 0;
    generating = false;
    packed_.clear();
    const bool binary = std::all_of(block.begin(), block.end(), [](char b) { return b == 0 || b == 1; });
    if (!binary || block.empty()) return;
    // Bits [0, length + 64) of the periodic stream, plus one spare word for the reads.
    const std::size_t total = block.size() + 64;
    packed_.assign(packedWords(total) + 1, 0);
    for (std::size_t at = 0; at < total;) {
        const std::size_t run = std::min(block.size(), total - at);
        std::vector<std::uint64_t> piece(packedWords(run) + 1);
        packBits(block.data(), run, piece.data());
        copyBits(packed_.data(), at, piece.data(), 0, run);
        at += run;
    }
}

void DataSourceBlock::checkRequest(int count) const {
    if (count < 0)
        throw std::out_of_range("DataSourceBlock::GetOneFrame: count " + std::to_string(count) +
                                " is negative");
    if (generating) return;
    if (position < 0 || (length > 0 && position >= length))
        throw std::out_of_range("DataSourceBlock::GetOneFrame: position " +
                                std::to_string(position) + " outside a block of " +
                                std::to_string(length) + " bits");
    if (length <= 0 && count > 0)
        throw std::invalid_argument(
            "DataSourceBlock::GetOneFrame: " + std::to_string(count) +
            " bits asked of an empty block (PatternBits or UserFile holds no bits)");
}

bool DataSourceBlock::GetPackedFrame(std::uint64_t* words, int count) {
    checkRequest(count);
    if (count == 0) return true;
    if (generating) {
        generator.Generate(generated_, count);
        if (std::any_of(generated_.begin(), generated_.begin() + count, [](char b) { return b != 0 && b != 1; }))
            return false;  // never for a PN register; kept for the contract
        packBits(generated_.data(), static_cast<std::size_t>(count), words);
        return true;
    }
    if (packed_.empty()) return false;
    // Word w starts at stream bit position + 64 w, which lies in the block modulo its length;
    // the periodic copy makes each word one unaligned read.
    const std::size_t n = static_cast<std::size_t>(count);
    const std::size_t period = static_cast<std::size_t>(length);
    const std::uint64_t* from = packed_.data();
    std::size_t at = static_cast<std::size_t>(position);
    const std::size_t whole = packedWords(n);
    for (std::size_t w = 0; w < whole; ++w) {
        const unsigned shift = static_cast<unsigned>(at % 64);
        const std::uint64_t* q = from + at / 64;
        words[w] = shift == 0 ? q[0] : (q[0] >> shift) | (q[1] << (64 - shift));
        at += 64;
        at = period >= 64 ? (at >= period ? at - period : at) : at % period;
    }
    if (n % 64 != 0) words[whole - 1] &= (std::uint64_t{1} << (n % 64)) - 1;
    position = static_cast<int>((static_cast<std::size_t>(position) + n) % period);
    return true;
}

template <typename T>
void DataSourceBlock::nextBits(std::vector<T>& bits, int count) {
    if (count < 0 || bits.size() < static_cast<std::size_t>(count))
        throw std::out_of_range("DataSourceBlock::GetOneFrame: count " + std::to_string(count) +
                                " for a vector of " + std::to_string(bits.size()) + " elements");
    if (generating) {
        generator.Generate(generated_, count);
        std::transform(generated_.begin(), generated_.begin() + count, bits.begin(), element<T>);
        return;
    }
    if (position < 0 || (length > 0 && position >= length))
        throw std::out_of_range("DataSourceBlock::GetOneFrame: position " +
                                std::to_string(position) + " outside a block of " +
                                std::to_string(length) + " bits");
    const char* data = block.data();
    if (position + static_cast<long long>(count) < length) {
        std::transform(data + position, data + position + count, bits.begin(), element<T>);
        position += count;
    } else if (count < length) {
        const int head = length - position;
        auto out = std::transform(data + position, data + length, bits.begin(), element<T>);
        std::transform(data, data + (count - head), out, element<T>);
        position = position + count - length;
    } else {
        if (length <= 0 && count > 0)
            throw std::invalid_argument(
                "DataSourceBlock::GetOneFrame: " + std::to_string(count) +
                " bits asked of an empty block (PatternBits or UserFile holds no bits)");
        // Bit by bit with the position wrapping modulo the length, done as whole runs.
        for (int done = 0; done < count;) {
            const int run = std::min(count - done, length - position);
            std::transform(data + position, data + position + run, bits.begin() + done, element<T>);
            done += run;
            position = (position + run) % length;
        }
    }
}

void DataSourceBlock::GetOneFrame(std::vector<int>& bits, int count) {
    nextBits(bits, count);
}

void DataSourceBlock::GetOneFrame(std::vector<char>& bits, int count) {
    nextBits(bits, count);
}

void DataSourceBlock::Reset() {
    position = 0;
    if (generating) {
        std::vector<char> seed;
        generator.Init(31, seed, 0);
    }
}

}  // namespace Orvalis_NR

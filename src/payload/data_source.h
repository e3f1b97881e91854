#pragma once
// Payload bit sources of the channels: a PayloadData setting turned into an endless stream.

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "models/payload_data.h"
#include "payload/pn.h"

namespace Orvalis_NR {

/// A stream of payload bits that a channel draws from frame by frame.
class DataSource {
  public:
    virtual ~DataSource() = default;

    /// The bits to hand out; the base only keeps them.
    virtual void Init(std::vector<char> bits) { stored = std::move(bits); }
    /// The next `count` bits into the start of `bits`, which holds at least `count` elements.
    virtual void GetOneFrame(std::vector<int>& bits, int count) { (void)bits, (void)count; }
    virtual void GetOneFrame(std::vector<char>& bits, int count) { (void)bits, (void)count; }
    /// The next `count` bits packed, first bit in bit 0 of words[0], into `words`, which holds
    /// at least (count + 63) / 64 words; bits past `count` in the last word are cleared. False,
    /// drawing nothing, when the source holds values other than 0 and 1: those go through
    /// GetOneFrame as they are.
    virtual bool GetPackedFrame(std::uint64_t* words, int count) { (void)words, (void)count; return false; }
    /// Back to the first bit.
    virtual void Reset() {}

    std::vector<char> stored;
};

/// A stored block handed out cyclically (PN9, PN15, PN23, patterns, user files), or the PN31
/// generator running without a stored block.
class DataSourceBlock : public DataSource {
  public:
    /// Builds the source from `PayLoadDataType`, `PatternBits` and `UserFile`.
    /// Throws std::runtime_error naming the file when a user file cannot be opened, and
    /// std::invalid_argument / std::out_of_range for a malformed number in a "PN23(a:b,...)"
    /// pattern.
    void Init(std::shared_ptr<Models::Nr5g::PayloadData> payload);
    void Init(std::vector<char> bits) override;
    /// Throws std::out_of_range when `bits` holds fewer than `count` elements or `count` is
    /// negative, std::invalid_argument when bits are asked of an empty block.
    void GetOneFrame(std::vector<int>& bits, int count) override;
    void GetOneFrame(std::vector<char>& bits, int count) override;
    /// The same bits as GetOneFrame, read from a packed copy of the block (PN31 packs what its
    /// generator gives). Throws as GetOneFrame does.
    bool GetPackedFrame(std::uint64_t* words, int count) override;
    void Reset() override;

    int length = 0;
    int position = 0;
    std::vector<char> block;
    bool generating = false;
    PN generator;

  private:
    template <typename T>
    void nextBits(std::vector<T>& bits, int count);
    void checkRequest(int count) const;
    std::vector<char> generated_;  // one request of the PN31 generator
    /// The block packed and continued periodically for one word past its end, so that the 64
    /// bits from any position are one read; empty when the block holds other values than 0, 1.
    std::vector<std::uint64_t> packed_;
};

/// Bits of a stored PN sequence of `degree` (PN9: 511, PN15: 32767, PN23: 0x7fffff bits).
std::vector<char> StoredPnSequence(int degree, int bitCount);

/// The "Custom Pattern" text as bits: "PN23(a:b,c:d,...)" cuts the pieces a..b, c..d out of
/// the stored PN23 sequence; any other text gives one element per character (code - '0').
std::vector<char> PatternToBits(const std::string& pattern);

/// The content of a user file: ".txt"/".csv" as text ('X'/'x' first: hexadecimal, else one
/// bit per character), any other name as bytes, most significant bit first.
/// Throws std::runtime_error naming the file when it cannot be opened or read.
std::vector<char> UserFileToBits(const std::string& fileName);

}  // namespace Orvalis_NR

#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/recogniser.h"

/// Writes the parts of a derivation out as the steps that a tree is built along.
namespace zr::engine {

/// One element of a path with its exact place in the tokens.
struct Step {
    std::uint16_t node;
    std::uint32_t low, high;  ///< possible positions ahead of it
    std::uint32_t at;         ///< the position it really starts at
    std::uint32_t child, childEnd;
};

class DerivationSteps {
 public:
    /// `types` are the tokens that the recogniser saw.
    DerivationSteps(const ParserTable& table, const Recogniser& recogniser,
                    const std::vector<std::uint16_t>& types);
    ~DerivationSteps();
    DerivationSteps(const DerivationSteps&) = delete;
    DerivationSteps& operator=(const DerivationSteps&) = delete;

    /// Puts the steps of an entry's end on top of those that are there.
    void open(std::uint32_t entry, std::uint32_t endState, std::uint32_t exact);
    /// Whether entries are open that have not been closed.
    bool isOpen() const { return !frames_.empty(); }
    /// The next step of the entry opened last, or null behind its last one. Holds until the next open().
    const Step* next() {
        Frame& top = frames_.back();
        return top.nextStep == top.stepsEnd ? nullptr : &steps_[top.nextStep++];
    }
    /// Drops the entry opened last and tells where it ends.
    std::uint32_t close();

 private:
    struct Frame {
        std::uint32_t nextStep, stepsEnd;  ///< into steps_
        std::uint32_t stepsBase;
        std::uint32_t exactEnd;
    };

    /// The steps of a thread's last tree, kept for its next one like the vectors of a search.
    static std::vector<Step>& spareSteps();
    void locate(std::uint32_t from, std::uint32_t exact);
    std::uint32_t runEndOf(std::uint32_t position) const;

    const ParserTable& table_;
    const Recogniser& recogniser_;
    const std::vector<std::uint16_t>& types_;
    std::vector<Step> steps_;
    std::vector<std::uint32_t> path_;
    std::vector<Frame> frames_;
};

}  // namespace zr::engine

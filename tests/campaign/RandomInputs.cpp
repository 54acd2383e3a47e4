// Fuzz targets with random inputs.  An input that breaks a promise is minimised: ranges of bytes are left out, the
// longest first, as long as a promise is still broken (Zeller and Hildebrandt, "Simplifying and isolating
// failure-inducing input", 2002).
#include "tests/campaign/Campaign.hpp"

#include <algorithm>
#include <optional>
#include <vector>

namespace VT::Campaign {

namespace {

using Bytes = std::vector<std::uint8_t>;

class RandomInputs final : public Job {
public:
    explicit RandomInputs(const std::string& name) {
        for (const Fuzz::Target& target : Fuzz::targets())
            if (name == target.name)
                target_ = &target;
    }

    void run(std::uint64_t seed, std::uint64_t item) override {
        std::mt19937_64 random = randomOf(seed, item);
        // Mostly short ones, in which more of the input decides; texts get letters that mean something.
        Bytes input(random() % (std::size_t{8} << random() % 6U));
        const bool isText = item % 2 == 0;
        static constexpr std::string_view letters("AB12=<>!&|()+-*/%~^, \n#'.[]{}:@ifdeflsn");
        for (std::uint8_t& byte : input)
            byte = isText ? static_cast<std::uint8_t>(letters[random() % letters.size()])
                          : static_cast<std::uint8_t>(random());
        ++runs_;
        bytes_ += input.size();
        if (broken(input))
            throw Broken(*broken(minimised(input)));
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(runs_) + " inputs of " + std::to_string(bytes_) + " bytes, " +
               std::to_string(Fuzz::demandsMade()) + " promises checked";
    }

private:
    /// What is broken, and the bytes of the input.
    [[nodiscard]] std::optional<std::string> broken(const Bytes& input) const {
        try {
            target_->run(input);
            return std::nullopt;
        } catch (const Broken& broken) {
            std::string words = broken.what() + std::string("\ninput:");
            for (const std::uint8_t byte : input) {
                static constexpr std::string_view digits("0123456789abcdef");
                words += std::string(" ") + digits[byte >> 4U] + digits[byte & 15U];
            }
            return words;
        }
    }

    [[nodiscard]] Bytes minimised(Bytes input) const {
        for (std::size_t length = std::max<std::size_t>(1, input.size() / 2); length > 0; length /= 2)
            for (std::size_t at = 0; at + length <= input.size();) {
                Bytes shorter = input;
                const auto from = shorter.begin() + static_cast<std::ptrdiff_t>(at);
                shorter.erase(from, from + static_cast<std::ptrdiff_t>(length));
                if (broken(shorter))
                    input = shorter;
                else
                    at += length;
            }
        return input;
    }

    const Fuzz::Target* target_ = nullptr;
    std::uint64_t runs_ = 0;
    std::uint64_t bytes_ = 0;
};

} // namespace

std::unique_ptr<Job> makeRandomInputs(const std::string& name) {
    return std::make_unique<RandomInputs>(name);
}

} // namespace VT::Campaign

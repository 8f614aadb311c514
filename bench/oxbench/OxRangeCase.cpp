// OxBase side of the range walk: a compact OxRangeList of evenly spaced
// records, walked with getFirstEntry and getNextEntry to the end.
#include "OxBench.h"

#include "oxbase/ranges/OxRangeList.h"

#include <memory>
#include <string>

namespace oxbench {
namespace {

class OxRangeWalk : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string& note) override {
        // The same records as the reference: record i holds the `width`
        // numbers from 2 * i * width on.
        unsigned int width = static_cast<unsigned int>(corpus.rangeMembers / corpus.rangeRecords);
        std::string text;
        for (unsigned int i = 0; i < corpus.rangeRecords; i++) {
            if (i > 0) {
                text += ",";
            }
            text += std::to_string(i * 2 * width) + "-" + std::to_string(i * 2 * width + width - 1);
        }
        list = std::make_unique<OxRangeList>(text.c_str(), "member");
        if (list->isValid() != OxTrue) {
            note = "the range text was not accepted";
            return false;
        }
        list->compact();
        return true;
    }
    Outcome run() override {
        double sum = 0.0;
        std::size_t members = 0;
        unsigned int number = 0;
        if (list->getFirstEntry(number) == OxTrue) {
            do {
                sum += number;
                members++;
                number = list->getNextEntry(number);
            } while (number != 0);
        }
        Outcome outcome;
        outcome.amount = static_cast<double>(members);
        outcome.check = sum;
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::unique_ptr<OxRangeList> list;
};
Registration oxRangeWalk("range-walk", "OxBase OxRangeList walk",
                         [] { return std::make_unique<OxRangeWalk>(); });

} // namespace
} // namespace oxbench

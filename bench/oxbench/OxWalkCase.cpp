// OxBase side of the walk: OxFileTreeWalk with 10 directory-stream slots and
// a callback that counts what it is given.
#include "OxBench.h"

#include "oxbase/io/OxFileTreeWalk.h"

#include <string>

namespace oxbench {
namespace {

int countEntry(const char*, const struct stat*, OxFileTreeWalkType, void* userData) {
    ++*static_cast<std::size_t*>(userData);
    return 0;
}

class OxWalk : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        root = corpus.tree;
        return true;
    }
    Outcome run() override {
        std::size_t count = 0;
        // One object per run: an object serves one walk (its inode table
        // remembers the directories it has entered).
        OxFileTreeWalk walk(root.c_str(), countEntry, 10, &count);
        Outcome outcome;
        outcome.ok = walk.run() == 0;
        outcome.amount = static_cast<double>(count);
        outcome.check = static_cast<double>(count);
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::string root;
};
Registration oxWalk("walk", "OxBase OxFileTreeWalk, 10 slots",
                    [] { return std::make_unique<OxWalk>(); });

} // namespace
} // namespace oxbench

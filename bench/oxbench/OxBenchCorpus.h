// Corpus generation for oxbench: every input is generated under a fresh
// temporary directory, deterministically, so that all implementations of a
// case read the same bytes.
#ifndef OXBENCH_OXBENCHCORPUS_H
#define OXBENCH_OXBENCHCORPUS_H

#include "OxBench.h"

#include <string>
#include <vector>

namespace oxbench {

/// Counts of the dense corpora, for the table's heading.
struct CorpusStats {
    std::size_t elements = 0;   ///< elements of the dense XML model
    std::size_t attributes = 0; ///< attributes of the dense XML model
    std::size_t records = 0;    ///< records of the dense CSV table
};

/// The paths and counts of a corpus below `dir` (nothing is written): what a
/// child process needs to find the corpus its parent generated.
void describeCorpus(Corpus& corpus, const std::string& dir, bool quick);

/// Creates the temporary directory and writes every corpus into it. `quick`
/// makes each corpus about a tenth of the full size. On failure returns false
/// with a reason in `error`.
bool generateCorpus(Corpus& corpus, bool quick, CorpusStats& stats, std::string& error);

/// The number text of the document model: fixed with nine decimals, trailing
/// zeros cut but one digit kept behind the point ("2.0", "-0.25").
std::string numberText(double value);

/// The lines the document writer sends for a model in its layout, as the
/// reader leaves it: one line per element (a list value that spanned several
/// lines joined by single blanks), and no empty line behind the declaration,
/// since a document that was read keeps its declaration line as it stood.
std::vector<std::string> writerLines(const std::string& path);

} // namespace oxbench

#endif

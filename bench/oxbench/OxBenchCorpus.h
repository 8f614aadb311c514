// Corpus generation for oxbench: every input is generated under a fresh
// temporary directory, deterministically, so that all implementations of a
// case read the same bytes.
#ifndef OXBENCH_OXBENCHCORPUS_H
#define OXBENCH_OXBENCHCORPUS_H

#include "OxBench.h"

#include <string>

namespace oxbench {

/// Creates the temporary directory and writes every corpus into it. `quick`
/// makes each corpus about a tenth of the full size. On failure returns false
/// with a reason in `error`.
bool generateCorpus(Corpus& corpus, bool quick, std::string& error);

/// The number text of the document model: fixed with nine decimals, trailing
/// zeros cut but one digit kept behind the point ("2.0", "-0.25").
std::string numberText(double value);

} // namespace oxbench

#endif

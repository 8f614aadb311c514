// The timed part shared by the OxBase document reads (XML and CSV).
#ifndef OXBASE_BENCH_OXBENCHDOCUMENT_H
#define OXBASE_BENCH_OXBENCHDOCUMENT_H

#include "OxBench.h"

#include "oxbase/io/OxFile.h"

#include <memory>
#include <string>

namespace oxbench {

/// Opens `path` for input in a new `Document` (kept in `file` until the
/// untimed afterRun) and reads it.
template <class Document>
Outcome readDocument(const std::string& path, std::unique_ptr<Document>& file) {
    file = std::make_unique<Document>(path.c_str(), OxFile::OxIOInput);
    Outcome outcome;
    outcome.ok = file->readFile() == OxTrue;
    if (!outcome.ok) {
        outcome.note = "readFile answered OxFalse";
    }
    outcome.amount = static_cast<double>(fileSize(path));
    return outcome;
}

} // namespace oxbench

#endif

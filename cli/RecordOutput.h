// The records a read or a flattening produced, printed record by record straight to
// the stream in each of zrdict's formats: nothing of the output is held beyond the
// record being written.
#pragma once

#include "MessageLog.h"
#include "zrapi.h"

#include <ostream>
#include <vector>

// The whole JSON document of read and flatten: status, records, messages.
void printRecordDocument(std::ostream& out, int status, const std::vector<const ZrRecord*>& records,
                         const std::vector<LoggedMessage>& messages);

// One aligned table per record, a blank line between two.
void printRecordsText(std::ostream& out, const std::vector<const ZrRecord*>& records);

// A field of the record type stands for the record of the same name in
// `dictionary`; the tree and the graph follow these links.
//
// Each of `roots` not already shown under an earlier one, as an indented tree: a
// nested record opens in place under its field; a record met again on its own path
// is marked recursive, one already opened elsewhere is marked as shown above, so
// every record is opened once.
void printRecordTree(std::ostream& out, const std::vector<const ZrRecord*>& roots,
                     const ZrRecordList& dictionary);

// A Graphviz digraph: a node per record (`roots` and every record they lead to)
// listing its simple fields and their types, an edge per record-type field to the
// nested record, labelled with the field's name.
void printRecordGraph(std::ostream& out, const std::vector<const ZrRecord*>& roots,
                      const ZrRecordList& dictionary);

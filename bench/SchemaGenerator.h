// Deterministic generator of large schema sets for the benchmarks: a main document
// and up to 20 included documents holding a chosen number of complex types, with
// the constructs the reader handles in the proportions of industry schemas.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace zrgen {

// Counts of what a generated set holds.
struct SetStats {
    long complexTypes = 0; // every complexType element, named or anonymous
    long namedComplexTypes = 0;
    long anonymousComplexTypes = 0;
    long extensionTypes = 0; // complexContent extensions of named types
    long longestExtensionChain = 0;
    long simpleContentTypes = 0;
    long simpleTypes = 0;       // named simple types
    long inlineSimpleTypes = 0; // anonymous simple types on declarations
    long groups = 0;
    long attributeGroups = 0;
    long globalElements = 0;
    long elementRefs = 0;
    long groupRefs = 0;
    long attributeGroupRefs = 0;
    long elements = 0;   // local element declarations
    long attributes = 0; // attribute declarations
    long annotations = 0;
};

struct GeneratedSet {
    std::string mainPath;               // the document to read
    std::vector<std::string> documents; // every document, the main one first
    uint64_t bytes = 0;                 // total size of all documents
    SetStats stats;
};

// Writes a set with exactly `complexTypes` complexType elements into `outDir`
// (which must exist) as main.xsd and partNN.xsd. The same size always gives the
// same bytes. Throws std::runtime_error when a file cannot be written.
GeneratedSet generateSchemaSet(long complexTypes, const std::string& outDir);

// The number of included documents a set of that size is split into.
int partCount(long complexTypes);

} // namespace zrgen

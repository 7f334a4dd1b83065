// The floor of the benchmarks: the schema reader's own parser, configured exactly as
// a read configures it, over the documents a read parses, in the reader's order,
// with a handler that does nothing but follow includes, imports and redefinitions. zrbench times it
// inside its own process; zrfloor runs it as a process of its own, against which whole zrdict
// processes are timed.
#pragma once

#include <string>
#include <vector>
#include <xercesc/sax/HandlerBase.hpp>

namespace zrfloor {

// UTF-8 of parser text.
std::string utf8(const XMLCh* text);

// Does no work but what reading the same documents needs: noting "include" elements.
class FloorHandler : public xercesc::HandlerBase {
  public:
    void startElement(const XMLCh* name, xercesc::AttributeList& attrs) override;

    void error(const xercesc::SAXParseException& e) override { fail(e); }

    void fatalError(const xercesc::SAXParseException& e) override { fail(e); }

    std::vector<std::string> includes;
    std::string firstError;

  private:
    void fail(const xercesc::SAXParseException& e);
};

// Parses `mainPath` and every document it includes, once each, in the reader's
// order, with `handler` (the floor's own, or one derived from it that does more).
// Returns the documents parsed; throws std::runtime_error when one of them fails.
std::vector<std::string> runFloor(const std::string& mainPath, FloorHandler& handler);
// The same with the floor's own handler.
std::vector<std::string> runFloor(const std::string& mainPath);

} // namespace zrfloor

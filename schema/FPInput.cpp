#include "FPInput.h"

#include "zrglob.h"

#include <algorithm>
#include <climits>
#include <xercesc/util/PlatformUtils.hpp>

std::atomic<XMLSize_t> FPInputStream::chunkLimit{0};

FPInputSource::FPInputSource(const ZrWChar* documentPath)
    : xercesc::InputSource(xercesc::XMLPlatformUtils::fgMemoryManager), path(documentPath) {
    // The source keeps its own copy of the system id.
    setSystemId(path.c_str());
}

FPInputSource::~FPInputSource() = default;

// A null stream makes the parser report that the document cannot be opened, which
// fails the read through its error callbacks.
xercesc::BinInputStream* FPInputSource::makeStream() const {
    auto* stream = new FPInputStream(path.c_str(), designMode);
    if (!stream->isOpen()) {
        delete stream;
        return nullptr;
    }
    stream->reportReadErrorTo(readError);
    return stream;
}

FPInputStream::FPInputStream(const ZrWChar* documentPath, bool designMode) : path(documentPath) {
    ZrString narrowPath;
    narrowPath.Assign(documentPath, ZR_CSET_DEFAULT, -1);
    if (fileProxy.openfile(narrowPath.c_str(), "rb", ZR_CSET_FILESYSTEM) != -1)
        fileProxy.setDesignMode(designMode);
}

FPInputStream::~FPInputStream() { fileProxy.close(false); }

XMLFilePos FPInputStream::curPos() const { return position; }

XMLSize_t FPInputStream::readBytes(XMLByte* buffer, XMLSize_t maxToRead) {
    XMLSize_t wanted = maxToRead;
    const XMLSize_t limit = chunkLimit.load(std::memory_order_relaxed);
    if (limit != 0 && wanted > limit)
        wanted = limit;
    if (wanted > static_cast<XMLSize_t>(LONG_MAX))
        wanted = static_cast<XMLSize_t>(LONG_MAX);
    const long count = fileProxy.read(reinterpret_cast<char*>(buffer), static_cast<long>(wanted));
    if (count < 0) {
        // The parser takes the count as a size; a negative one must never reach
        // it. The document ends here instead (an exception would leak parser
        // state when it leaves the parser's reader set-up), and the recorded
        // error fails the read.
        if (!readError || !*readError)
            ZrGlob::LogMessage(ZR_SEV_ERROR, 4, lgettext(u"Schema: Error: Reading file %s failed"),
                               path.c_str());
        if (readError)
            *readError = true;
        return 0;
    }
    position += static_cast<XMLFilePos>(count);
    return static_cast<XMLSize_t>(count);
}

const XMLCh* FPInputStream::getContentType() const { return nullptr; }

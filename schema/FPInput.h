// Parser input over the host file proxy.
#pragma once

#include "zrfile.h"
#include "zrstring.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <xercesc/sax/InputSource.hpp>
#include <xercesc/util/BinInputStream.hpp>

class FPInputSource : public xercesc::InputSource {
  public:
    explicit FPInputSource(const ZrWChar* path);
    FPInputSource(const FPInputSource&) = delete;
    FPInputSource& operator=(const FPInputSource&) = delete;
    ~FPInputSource() override;

    xercesc::BinInputStream* makeStream() const override;

    // True once a stream of this source failed to read its file; the parse then
    // saw the document end early.
    bool readFailed() const { return *readError; }

  private:
    ZrWString path;
    bool designMode = false;
    // Shared with the streams, which the parser may keep a little longer.
    std::shared_ptr<bool> readError = std::make_shared<bool>(false);
};

class FPInputStream : public xercesc::BinInputStream {
  public:
    FPInputStream(const ZrWChar* path, bool designMode);
    FPInputStream(const FPInputStream&) = delete;
    FPInputStream& operator=(const FPInputStream&) = delete;
    ~FPInputStream() override;

    bool isOpen() const { return fileProxy.isOpen(); }

    XMLFilePos curPos() const override;
    XMLSize_t readBytes(XMLByte* buffer, XMLSize_t maxToRead) override;
    const XMLCh* getContentType() const override;

    // Where a failed read is recorded.
    void reportReadErrorTo(std::shared_ptr<bool> flag) { readError = std::move(flag); }

    // Largest number of bytes one readBytes call hands out; 0 for no limit. Tests
    // lower it to prove the reader does not depend on how the input is chunked.
    static std::atomic<XMLSize_t> chunkLimit;

  private:
    ZrFileProxy fileProxy;
    XMLFilePos position = 0;
    ZrWString path;
    std::shared_ptr<bool> readError;
};

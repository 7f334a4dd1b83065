// A namespace-qualified name, exported for hosts.
#pragma once

#include "zrbxmls_export.h"
#include "zrstring.h"

class ZRBXMLS_API ZrXmlQName {
  public:
    ZrXmlQName();
    ZrXmlQName(const ZrXmlQName& other);
    ZrXmlQName& operator=(const ZrXmlQName& other);
    ~ZrXmlQName();

    const ZrXString& localPart() const { return localPart_; }

    const ZrXString& namespaceURI() const { return namespaceURI_; }

    // True when both parts are empty.
    bool isNull() const;

  private:
    ZrXString localPart_;
    ZrXString namespaceURI_;
};

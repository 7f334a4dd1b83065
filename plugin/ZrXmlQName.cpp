#include "ZrXmlQName.h"

ZrXmlQName::ZrXmlQName() : localPart_(ZR_CSET_DEFAULT), namespaceURI_(ZR_CSET_DEFAULT) {}

ZrXmlQName::ZrXmlQName(const ZrXmlQName& other) = default;

ZrXmlQName& ZrXmlQName::operator=(const ZrXmlQName& other) = default;

ZrXmlQName::~ZrXmlQName() = default;

bool ZrXmlQName::isNull() const { return localPart_.size() == 0 && namespaceURI_.size() == 0; }

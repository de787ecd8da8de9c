// PathBase::PathVector: conversions to and from StringVector.
#include "tekit/paths/PathVector.h"

#include "tekit/strings/StringVector.h"

namespace tekit {

void PathBase::PathVector::CreateStringVector(StringVector& texts) const {
    texts.clear();
    texts.reserve(size());
    for (Path const& path : *this)
        texts.emplace_back(path.CStr(), true);
}

void PathBase::PathVector::SetFromStringVector(StringVector const& texts) {
    clear();
    reserve(texts.size());
    for (DynamicString const& text : texts)
        emplace_back(text);
}

} // namespace tekit

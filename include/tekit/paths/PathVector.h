// PathBase::PathVector: an ordered list of Path, convertible to and from StringVector.
//
//   PathBase::PathVector paths;
//   paths.SetFromStringVector(names);         // one Path per text, each normalised
//   StringVector texts;
//   paths.CreateStringVector(texts);
#pragma once

#include "tekit/paths/Path.h"

#include <vector>

namespace tekit {

class StringVector;

class TEKIT_API PathBase::PathVector : public std::vector<Path> {
public:
    using std::vector<Path>::vector;
    PathVector() = default;

    /// Replaces the contents of `texts` by the paths' texts, in order.
    void CreateStringVector(StringVector& texts) const;
    /// Replaces the paths by one per text of `texts`, in order.
    void SetFromStringVector(StringVector const& texts);
};

} // namespace tekit

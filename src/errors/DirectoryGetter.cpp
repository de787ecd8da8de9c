// DirectoryGetter: the interface's one out-of-line member, so its type information lives in
// the library.
#include "tekit/errors/DirectoryGetter.h"

namespace tekit {

DirectoryGetter::~DirectoryGetter() = default;

} // namespace tekit

// Journey: takes an image file through the loader onto the GPU, paints on it, and saves it.
// Thread: one, which waits; not the loader's.
#pragma once

#include "moka/base/String.h"

#include <jni.h>
#include <string>

namespace Moka::Testing {

// The name of the Java thread that the loader called back on; "!" and what went wrong otherwise.
std::string LoadDrawSave(JavaVM* vm, String const& from, String const& to);

} // namespace Moka::Testing

// What a command of vss can end with, and how it complains.
#pragma once

#include "tools/common/exit_code.h"

namespace vss {

using tool::Exit;
using tool::fail;

}  // namespace vss

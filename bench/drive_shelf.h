// A vendor with one controller and as many drives behind it as one likes.
#pragma once

#include <chrono>

#include "scenario.h"

namespace bench {

/// All drives in one pool and one enclosure; every query takes `answerTime`.
testbed::Scenario driveShelf(int drives, std::chrono::milliseconds answerTime);

}  // namespace bench

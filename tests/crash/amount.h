// How much the program does.
#pragma once

namespace CrashTest {

enum class Amount { kShort, kLong };

// kShort, unless the program was started with --long.
Amount AmountOfWork();

inline int Either(int inShort, int inLong) {
  return AmountOfWork() == Amount::kShort ? inShort : inLong;
}

}  // namespace CrashTest

// A library that a program loads while it runs, and that sees the public header alone.
#pragma once

// What the plug-in throws.
enum class Raised { kFailure, kRetry, kOfTheLibrary };

// The name and the type of its one function. Its exceptions cross two borders.
inline constexpr char kRaiseName[] = "Raise";
using RaiseFunction = void (*)(Raised);

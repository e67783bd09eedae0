#pragma once

/// Divides what a program does into steps whose exact cost can be told: allocations and their bytes by itself, the
/// instructions by whatever it runs under. A step ends where the next begins, and what lies between `end` and `begin`
/// counts nowhere.
///
/// Under callgrind every end of a step is a dump named after it; under qemu-arm it is a line of the plugin in
/// cost/arm. Otherwise nobody takes notice.
///
/// Nothing counts before `arm`: the first time that something runs costs what later ones do not.
///
///     for (int i = 0; i < 2; ++i)
///     {
///         Steps::begin("dial");
///         adapter.dial(...);      // inside, the other side: Steps::next("accept"); ... Steps::next("dial");
///         Steps::begin("drop");
///         adapter.drop(...);
///         Steps::end();
///         Steps::arm();
///     }
///     Steps::print();
///
/// Names must live on and may come again: the sum is printed.
namespace Steps
{
void arm();
void begin(char const* step);
/// Begins the step only if one is under way: for code that also runs unmeasured.
void next(char const* step);
void end();
/// A line "step allocations bytes" for each, the three separated by tabs, in the order in which they first came.
void print();
} // namespace Steps

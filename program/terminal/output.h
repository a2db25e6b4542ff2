#pragma once

#include <velmora/error.h>

#include <string>

// Standard output: what is printed there is buffered, so that it may fail late.

namespace velmora::cli {

// Writes at once. False if the reader has gone, who has read enough then. Throws Error if the text can't be written.
bool writeOutput(std::string const& text);

// Writes what was printed so far; throws std::system_error, as printing does, if that fails.
void flushOutput();

// Writes to standard error. Where that can't be written to there is nobody to be told.
void tell(std::string const& text);

// Tells of a file that could not be written any more while the program went on, and makes it end with exit code 1.
void tellLateFailure(std::string const& text);
bool lateFailure();

// What to tell of an error number of standard output.
Error outputFailure(int error);

} // namespace velmora::cli

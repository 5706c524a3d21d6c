// AtomicFile: files that appear complete or not at all.
#ifndef MORVIK_REPORT_ATOMICFILE_H
#define MORVIK_REPORT_ATOMICFILE_H

#include <string>

namespace report {

/// Throws std::runtime_error, saying why, unless writeAtomically can be expected to work. Changes nothing.
void checkWritable(const std::string& fileName);

/// Puts the file in the place of what was there. Until then, what was there stays as it is; so it does when writing
/// fails, which throws std::runtime_error. What is no regular file, a pipe or a device, is written straight through.
void writeAtomically(const std::string& fileName, const std::string& content);

}  // namespace report

#endif

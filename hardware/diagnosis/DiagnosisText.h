// DiagnosisText: a diagnosis as text and as JSON.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSISTEXT_H
#define MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSISTEXT_H

#include <cstddef>
#include <string>

#include "Diagnosis.h"

namespace morvik::diagnosis {

/// Lines that say what was tried, what was found, and what to change.
/// A number with so many decimals.
std::string fixed(double value, int decimals);

/// "18.2 %".
std::string percent(const Signs& signs);

/// The verdict as a word.
const char* nameOf(Verdict verdict);

std::string textOf(const Diagnosis& diagnosis);

/// The same as lines of a JSON object, with all attempts.
std::string jsonOf(const Diagnosis& diagnosis);

}  // namespace morvik::diagnosis

#endif

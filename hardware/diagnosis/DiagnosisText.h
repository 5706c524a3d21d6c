// DiagnosisText: a diagnosis for people, and for programs.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSISTEXT_H
#define MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSISTEXT_H

#include <string>

#include "Diagnosis.h"

namespace morvik::diagnosis {

/// What was tried, what was found, and what to change; lines.
std::string textOf(const Diagnosis& diagnosis);

/// The same as a JSON object, with all that was tried; lines.
std::string jsonOf(const Diagnosis& diagnosis);

}  // namespace morvik::diagnosis

#endif

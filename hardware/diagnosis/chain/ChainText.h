// ChainText: a diagnosis of transport blocks as text and as JSON.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINTEXT_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINTEXT_H

#include <string>

#include "ChainDiagnosis.h"

namespace morvik::diagnosis {

std::string textOf(const ChainDiagnosis& diagnosis);
std::string jsonOf(const ChainDiagnosis& diagnosis);

}  // namespace morvik::diagnosis

#endif

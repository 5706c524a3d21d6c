// TransportJson: how a set's transport blocks are sent, as the manifest tells it.
#ifndef MORVIK_HARDWARE_VECTORS_TRANSPORTJSON_H
#define MORVIK_HARDWARE_VECTORS_TRANSPORTJSON_H

#include "Block.h"
#include "Settings.h"
#include "base/Json.h"

namespace morvik::vectors {

/// A format of transport blocks, with the sizes and scales that follow from it.
nlohmann::ordered_json formatJson(const simulation::Point& point);

/// Reads one for the core of the settings. Throws base::Error for a format that cannot be sent.
simulation::Point formatFrom(const base::JsonMembers& json, const Settings& settings);

/// A signal-to-noise ratio in thousandths of a decibel, which the file has in decibels, up to `most` from 0.
int milliDecibelsFrom(const base::JsonMembers& json, const char* name, int most);

/// Adds the origin of a code block to what is told of the block, and reads it.
void addOrigin(const Origin& origin, nlohmann::ordered_json& block);
Origin originFrom(const base::JsonMembers& json);

}  // namespace morvik::vectors

#endif

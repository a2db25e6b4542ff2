#pragma once

/// What the companion library shows to those who link it.
#define VELMORA_EXPORT __attribute__((visibility("default")))

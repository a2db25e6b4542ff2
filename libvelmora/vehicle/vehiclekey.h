#pragma once

#include <velmora/vin.h>

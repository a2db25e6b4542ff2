#pragma once

#include <obd/iobdproxy.h>
#include <velmora/vin.h>

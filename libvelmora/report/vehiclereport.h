#pragma once

#include "libvelmora/report/codereport.h"
#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/freezereport.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"

#include <velmora/report.h>

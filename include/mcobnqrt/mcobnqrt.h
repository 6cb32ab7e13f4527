#ifndef MCOBNQRT_MCOBNQRT_H
#define MCOBNQRT_MCOBNQRT_H

/// The whole interface of the library. A host includes this header, or just those of the classes that it uses.

#include <mcobnqrt/binattributeresults.h>
#include <mcobnqrt/binattributetargetresults.h>
#include <mcobnqrt/bincatnumencoder.h>
#include <mcobnqrt/bincatvar.h>
#include <mcobnqrt/bincontvar.h>
#include <mcobnqrt/binfactory.h>
#include <mcobnqrt/binnumericinterval.h>
#include <mcobnqrt/binnumericusermissing.h>
#include <mcobnqrt/binoutput.h>
#include <mcobnqrt/binprogressreporter.h>
#include <mcobnqrt/binroundencoder.h>
#include <mcobnqrt/binsettings.h>
#include <mcobnqrt/binstringencoder.h>
#include <mcobnqrt/binstringinterval.h>
#include <mcobnqrt/binstringusermissing.h>
#include <mcobnqrt/binvariable.h>
#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/binweightvar.h>
#include <mcobnqrt/efbinfactory.h>
#include <mcobnqrt/efbinoutput.h>
#include <mcobnqrt/efbinsettings.h>
#include <mcobnqrt/export.h>
#include <mcobnqrt/ibinalgorithm.h>
#include <mcobnqrt/ibinencoder.h>
#include <mcobnqrt/ibinrecordsource.h>
#include <mcobnqrt/ibinusermissing.h>
#include <mcobnqrt/ibinvariable.h>
#include <mcobnqrt/iefbinalgorithm.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcquerycancel.h>
#include <mcobnqrt/mcstatus.h>
#include <mcobnqrt/progresslistener.h>
#include <mcobnqrt/progressreport.h>

#endif

// The copy of one listed entry with all that goes with it, for the passes and the manual view alike.
#pragma once

#include "copy/companion.h"
#include "copy/copy_context.h"
#include "copy/file_copy.h"

namespace orvane {

// Copies the file, and with a ".wkf" job file its companion folder. The job file comes first, to beside its
// target, and takes its name there when its companion is whole: so a job whose file cannot be read takes no
// companion along, and one whose companion was interrupted is begun again by the next run. A job file whose
// name without extension is not that of a folder ("..wkf", "...wkf") has none.
//
// `name` is the end of the file's paths, which must satisfy CanCopy. The result is the file's own, or the
// companion's where that is not whole.
CopyOutcome CopyEntry(const FileToCopy& file, std::wstring_view name, const CopyContext& context,
                      const CompanionRules& rules);

}  // namespace orvane

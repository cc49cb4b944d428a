#pragma once

#include "Series.h"

#include <string>

/// Writes a volume that was reduced from a series, `factor` slices to one, as a DICOM series of its own into `folder`:
/// with new UIDs, the source's patient, study and frame of reference, and in each image the instances that it was made
/// of. `uid` becomes the UID of the new series.
KpResult writeDerived(Volume& reduced, const Series& source, long factor, const std::string& folder,
                      KpProgressInterface& progress, std::string& uid);

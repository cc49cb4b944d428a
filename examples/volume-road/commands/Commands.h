#pragma once

#include "Job.h"

// The commands of the program, one function each. A failure has a text of one line for the user.

/// Writes a NIfTI volume, or the phantom if no source is given, as a DICOM series.
KpResult makeSeries(const Job& job, KpProgressInterface& progress);

/// Processes the volume of the job in all stages and writes its pictures, reports and page into
/// the target. All pictures are written, or none.
KpResult run(const Job& job, KpProgressInterface& progress);

/// Measures the largest region of a series: measure.png, the middle slice with the measures drawn over it, and
/// measures.txt, or measures.json.
KpResult measure(const Job& job, KpProgressInterface& progress);

/// Writes the volume of a series as one raw file.
KpResult exportSeries(const Job& job, KpProgressInterface& progress);

/// Reads a series, reduces and segments it, and sends it to a peer as one message; waits until the peer has confirmed
/// the content hash. Writes its pictures into the target, if there is one.
KpResult send(const Job& job, KpProgressInterface& progress);

/// Waits for one peer, receives its message, checks it against its content hash, writes its pictures into the target,
/// and confirms the hash. The port (0: any free one) is printed.
KpResult serve(const Job& job);

/// Prints the header of one file as a tree.
KpResult printHeader(const Job& job);

/// Prints the tags that differ between the headers of two files. Private tags are compared by their creators, and long
/// binary values by their size. KpResult::False if some do.
KpResult diffHeaders(const Job& job);

/// Prints every series and volume below a folder.
KpResult list(const Job& job, KpProgressInterface& progress);

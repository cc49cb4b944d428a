#pragma once

#include <kplib/log/KpResult.h>
#include <kplib/param/HxParamBundle.h>

#include <string>

class DcmElement;
class DcmFileFormat;
class DcmItem;
class DcmTag;

/// Adds every element of `dataSet` to `all`: a leaf is "Description: value" under its tag's name, with "[CREATOR]"
/// before the description of a private one; a sequence is a bundle of items, and where private blocks are reserved
/// there is an index of their creators.
void fillTree(HxParamBundle& all, DcmItem& dataSet);

/// The header of a file, its meta information included, into `DICOM`/`All` of `root`; text becomes UTF-8 where it can.
void fillHeader(HxParamBundle& root, DcmFileFormat& file);

/// Reads a file's header, of whatever kind the object is; a file that is not DICOM, or cut off, is a failure.
KpResult readHeader(const char* path, HxParamBundle& root);

/// Loads a file; large values stay on disk until they are asked for. A failure names the file and what is wrong with
/// it.
KpResult loadDicom(const char* path, DcmFileFormat& file);

/// The creator that has reserved the block of a private tag; empty for other tags, and where none has.
std::string creatorOf(DcmItem& parent, const DcmTag& tag);

/// The value of an element as text, on one line: binary numbers exactly, long binary values by their size.
KpString valueText(DcmElement& element);

/// Whether the file can be opened and read; errno says why not.
bool canRead(const char* path);

/// Whether the file says of itself that it is DICOM, by the mark after its preamble.
bool hasDicomMark(const char* path);

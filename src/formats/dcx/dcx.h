#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// DCX, a collection of PCX pictures. Statuses: those of PCX for the page that is asked for,
// DamagedFile (2) without the signature, FileReadError (3) for a page behind the end of the file,
// NoImages (20) for a page that the file does not have.
Status DcxInfo(PictureRecord& picture, const ReadRequest& request);
Status DcxRead(PictureRecord& picture, const ReadRequest& request);
// Writes a collection of one page. Statuses of PCX.
Status DcxWrite(PictureRecord& picture, const WriteOptions& options);
// A file of several pictures.
Status DcxSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

}  // namespace fotomill

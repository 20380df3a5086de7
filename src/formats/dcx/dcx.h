#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"

namespace fotomill {

// DCX, a collection of PCX pictures. Statuses: those of PCX for the requested page, DamagedFile (2)
// without the signature, FileReadError (3) for a page beyond the end of the file, NoImages (20) if
// the page does not exist.
Status DcxInfo(PictureRecord& picture, const ReadRequest& request);
Status DcxRead(PictureRecord& picture, const ReadRequest& request);
// Writes a collection of one page. Statuses of PCX.
Status DcxWrite(PictureRecord& picture, const WriteOptions& options);
// Writes a file with several pictures.
Status DcxSequenceBegin(const std::string& path, const SequenceFacts& facts,
                        const WriteOptions& options, SequencePointer& sequence);

}  // namespace fotomill

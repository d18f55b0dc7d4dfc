// KeySectionDecoder: a decoder of a key section that its rules describe completely. Every call admits the
// record by the rules (RecordRule.h) and writes what the record's rule shows, its fields or its writer, into
// the section.
//
// Contract: the rules are static data that outlive the decoder; a subclass passes its class-index row and its
// rules and declares nothing else.
#pragma once

#include "LogGenerator/DecoderTable.h"
#include "LogGenerator/RecordRule.h"

namespace velmar {

class KeySectionDecoder : public TableDecoder {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) final {
        if (const RecordRule* rule = admitRecord(rules_, data, logCode)) {
            writeRecord(*rule, data, sectionDictionary());
        }
    }

  protected:
    KeySectionDecoder(const DecoderRow& row, const DecoderRules& rules) : TableDecoder(row), rules_(rules) {}

  private:
    const DecoderRules& rules_;
};

}  // namespace velmar

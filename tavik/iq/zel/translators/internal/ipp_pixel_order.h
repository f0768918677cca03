// The pixel-order word that the IPP raw stages (disparity, defective pixels) share: the main ISP's
// code of the Bayer pattern in bits 0-1, bit 4 set, bits 8 and 12 cleared. Each record names the
// four fields alike, so that both units write the word through this one function.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_IPP_PIXEL_ORDER_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_IPP_PIXEL_ORDER_H_

#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik::ipp_pixel_order_internal {

template <typename Record>
void WriteIppPixelOrderWord(Record& record, vosbrine::BayerPattern bayer_pattern) {
  TAVIK_SET_FIELD(record, pixel_order, vosbrine::GetMainIspPixelOrder(bayer_pattern));
  record.order_bit4 = 1;
  record.order_bit8 = 0;
  record.order_bit12 = 0;
}

}  // namespace tavik::ipp_pixel_order_internal

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_IPP_PIXEL_ORDER_H_

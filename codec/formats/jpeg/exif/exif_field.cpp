// One entry of an EXIF directory: how long its value is, and where it stands.
#include "codec/formats/jpeg/exif/exif_reader.h"

namespace pelo::jpeg {

// Bytes up to four stand in the entry. So does a single number; two SHORTs would too, but are not read.
// Everything else, rationals always, stands at the offset that the entry holds.
int read_field(const tiff::Structure* tiff, const uint8_t* entry, PELOJ_EXIFFIELD* field) {
  const tiff::Entry head = tiff::parse_entry(entry, tiff->order);
  const uint32_t unit = tiff::type_size(head.type);
  if (unit == 0) return 0;
  *field = {head.tag, head.type, head.count, tiff::load32(head.field, tiff->order), 0, nullptr};

  const uint64_t length = uint64_t{unit} * head.count;
  if (unit == 2 && head.count == 2) return 0;
  if (unit == 1 && head.count <= 4) {
    field->value = head.field;
  } else if ((unit == 2 || unit == 4) && head.count == 1) {
    field->number = *head.first_value();
  } else {
    if (!tiff->holds(field->number, length)) return 0;
    field->value = tiff->data + field->number;
  }
  field->length = static_cast<uint32_t>(length);  // fits: four bytes or inside the structure
  return 1;
}

}  // namespace pelo::jpeg

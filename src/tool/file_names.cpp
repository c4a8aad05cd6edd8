#include "tool/file_names.h"

#include <optional>

#include "env/message_table.h"

namespace pc {

namespace {

struct FileKind {
  int code;
  const char* defaultName;
  const char* key;
};

constexpr FileKind kFileKinds[] = {
    {101, "$TRXZONE/$TRXDATA/*.trn", "VIEW"},
    {102, "$TRXZONE/$TRXDATA/*.pnt", "POINTS"},
    {103, "$TRXZONE/$TRXDATA/*.crv", "CURVES"},
    {104, "$TRXZONE/$TRXDATA/*.ccv", "LIMITS"},
    {105, "$TRXDATA/*.ref", "AXIS_SYSTEM"},
    {106, "$TRXZONE/$TRXDATA/*.lev", "LEVELS"},
    {1010, "$TRXZONE/*.res", "TOOLPATH"},
    {1011, "$TRXZONE/*.edt", "EDITED_TOOLPATH"},
    {1012, "$TRXZONE/*.par", "TOOL_PARAMETERS"},
    {1013, "$TRXZONE/*.nom", "TOOL_LIMITS_NAME"},
    {1014, "$TRXZONE/*.zma", "TOOL_Z_MAX"},
    {1015, "$TRXZONE/*.lim", "TOOL_LIMITS"},
    {1016, "$TRXZONE/*.mul", "TOOL_VIEW"},
    {1017, "$TRXZONE/*.per", "TOOL_DRILL_POINTS"},
    {1018, "$TRXZONE/*.niv", "TOOL_LEVELS"},
    {1019, "$TRXZONE/*.cur", "TOOL_MACHINED_CURVE"},
    {1020, "$TRXZONE/basepart.bas", "PART"},
    {1021, "$TRXZONE/baseface.bas", "SURFACES"},
    {1022, "$TRXZONE/transfo.dat", "TARNEX_AXIS_SYSTEM"},
    {1023, "$TRXZONE/restlim.res", "RESTMAT_CONTOUR"},
    {1024, "$TRXZONE/restmat.res", "RESTMAT_GRID"},
    {1025, "$TRXZONE/stock.res", "STOCK"},
    {1026, "$TRXZONE/*.hld", "HOLDER"},
};

const FileKind* findKind(int code) {
  for (const FileKind& kind : kFileKinds)
    if (kind.code == code) return &kind;
  return nullptr;
}

}  // namespace

const char* defaultFileName(int code) {
  const FileKind* kind = findKind(code);
  return kind != nullptr ? kind->defaultName : "";
}

const char* fileNameKey(int code) {
  const FileKind* kind = findKind(code);
  return kind != nullptr ? kind->key : "";
}

std::string fileKindName(int code) {
  const char* key = fileNameKey(code);
  if (*key != '\0') {
    const std::optional<std::string> configured = lookupFileName(key);
    if (configured && !configured->empty()) return *configured;
  }
  return defaultFileName(code);
}

}  // namespace pc

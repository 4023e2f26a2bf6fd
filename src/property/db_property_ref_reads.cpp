// kvsvdbGetPropRef and kvsvdbGetPropRef1D: the objects a database property refers to, as the
// reference texts by which a host holds database objects. Which name an object is known by follows
// from the property that refers to it.
#include <cstdint>
#include <iterator>

#include "core/internal_error.h"
#include "core/status.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/annotate_property_status.h"
#include "property/property_id_names.h"
#include "session/db_reference_strings.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineRefIsText = 1471;
constexpr uint32_t kLineRefUnknown = 1535;
constexpr uint32_t kLineRef1DIsText = 1676;
constexpr uint32_t kLineRef1DUnknown = 1744;

struct tNameOf {
  uint32_t listProperty;
  uint32_t nameProperty;
};

constexpr tNameOf kSingleNames[] = {
    {kvPropClst_DatabaseRef, kvPropDatabase_Name},
    {kvPropFrm_ClusterRef, kvPropClst_Name},
    {kSignalClusterRef, kvPropClst_Name},
    {kSubframeClusterRef, kvPropClst_Name},
    {kvPropECU_ClstRef, kvPropClst_Name},
    {kvPropLINSched_ClstRef, kvPropClst_Name},
    {kLinScheduleEntryClusterRef, kvPropClst_Name},
    {kvPropPDU_ClusterRef, kvPropClst_Name},
    {kvPropFrm_MuxDataMuxSigRef, kvPropSig_NameUniqueToCluster},
    {kvPropPDU_MuxDataMuxSigRef, kvPropSig_NameUniqueToCluster},
    {kvPropSig_FrameRef, kvPropFrm_Name},
    {kvPropSubfrm_FrmRef, kvPropFrm_Name},
    {kvPropECU_FlexRayStartupFrameRef, kvPropFrm_Name},
    {kvPropSig_PDURef, kvPropPDU_Name},
    {kvPropSubfrm_PDURef, kvPropPDU_Name},
    {kvPropSig_MuxSubfrmRef, kvPropSubfrm_NameUniqueToCluster},
    {kvPropLINSchedEntry_CollisionResSched, kvPropLINSched_Name},
    {kvPropLINSchedEntry_Sched, kvPropLINSched_Name},
};

constexpr tNameOf kListNames[] = {
    {kvPropDatabase_ClstRefs, kvPropClst_Name},
    {kvPropClst_ECURefs, kvPropECU_Name},
    {kvPropClst_FrmRefs, kvPropFrm_Name},
    {kvPropECU_RxFrmRefs, kvPropFrm_Name},
    {kvPropECU_TxFrmRefs, kvPropFrm_Name},
    {kvPropLINSchedEntry_Frames, kvPropFrm_Name},
    {kvPropPDU_FrmRefs, kvPropFrm_Name},
    {kvPropClst_SigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropFrm_SigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropFrm_MuxStaticSigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropSubfrm_DynSigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropPDU_SigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropPDU_MuxStaticSigRefs, kvPropSig_NameUniqueToCluster},
    {kvPropClst_PDURefs, kvPropPDU_Name},
    {kvPropFrm_PDURefs, kvPropPDU_Name},
    {kvPropClst_LINSchedules, kvPropLINSched_Name},
    {kvPropFrm_MuxSubframeRefs, kvPropSubfrm_NameUniqueToCluster},
    {kvPropPDU_MuxSubframeRefs, kvPropSubfrm_NameUniqueToCluster},
    {kvPropLINSched_Entries, kvPropLINSchedEntry_NameUniqueToCluster},
};

struct tRefShape {
  uint32_t mode;
  uint32_t lineIsText;
  uint32_t lineUnknown;
  const tNameOf *names;
  size_t numNames;
};

constexpr tRefShape kSingle{kReferenceString, kLineRefIsText, kLineRefUnknown, kSingleNames,
                            std::size(kSingleNames)};
constexpr tRefShape kList{kReferenceArray, kLineRef1DIsText, kLineRef1DUnknown, kListNames,
                          std::size(kListNames)};

Status ReadReferences(const tRefShape &shape, uint32_t object, uint32_t id, SvHandle *value) {
  // A name has a shape of its own here: a text property is no reference.
  if (PropertyType(id) == kPropertyTypeText) {
    return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseProperties, shape.lineIsText, id);
  }
  uint32_t nameId = 0;
  for (size_t i = 0; i < shape.numNames; ++i) {
    if (shape.names[i].listProperty == id) nameId = shape.names[i].nameProperty;
  }
  if (nameId == 0) {
    const Status reported =
        ReportInternalError(kComponentKvsvapi, nFile::kDatabaseProperties, shape.lineUnknown, id);
    if (reported < 0) return reported;
  }
  if (value == nullptr) return kvErrNullArgument;
  tReferenceOutput output;
  output.handle = value;
  return BuildReferenceStrings(object, id, nameId, output, shape.mode, 1);
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropRef(uint32_t object, uint32_t id, SvHandle *value,
                                                   SvHandle *info) {
  return AnnotatedStatus(ReadReferences(kSingle, object, id, value), id, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropRef1D(uint32_t object, uint32_t id,
                                                     SvHandle *value, SvHandle *info) {
  return AnnotatedStatus(ReadReferences(kList, object, id, value), id, info);
}

// Persistent blocks of ZvPath2fProp1d, of today and of the first format.
#include <zv/path2f_prop1d.h>
#include <zv/std_fcurve.h>

#include <climits>
#include <memory>
#include <new>

#include "core/le_bytes.h"
#include "shape/path2f_prop1d_impl.h"
#include "shape/path_codes.h"
#include "shape/path_well_formed.h"
#include "shape/shape_lock.h"

namespace {

// The kind word carries the format in its upper half: bytes 0, 1 there (0x0100 << 16).
constexpr std::uint32_t kVersion = 0x01000000u;
// Between the first format (0) and this one no format was ever written: refused.
constexpr std::uint32_t kFirstCurrentVersion = 16711681u;
// Kind word, the record count, and the inner path's length prefix.
constexpr unsigned int kBodyFixed = 12;
// Subpath start and the curve's length prefix.
constexpr unsigned int kRecordFixed = 8;
// The inner path body: kind word, point count, open flag; 9 bytes a point.
constexpr unsigned int kPathBodyFixed = 12;
constexpr unsigned int kPathBytesPerPoint = 9;

// The first format kept standard curves. Their handles are dropped: the property becomes the
// polygon through their keys, on a curve that starts from a key of 1.0 at arc length 0 unless
// the old curve has its first key there.
std::unique_ptr<ZvRawFCurve> ConvertOldCurve(const ZvStdFCurve& old) {
  auto raw = std::make_unique<ZvRawFCurve>(0.0, 1.0);
  ZvBaseFCurve::FCurveInfo info{};
  info.mask = ZvBaseFCurve::FCurveInfo::ValueWhenNoKeysMask |
              ZvBaseFCurve::FCurveInfo::MinClampMask | ZvBaseFCurve::FCurveInfo::MaxClampMask |
              ZvBaseFCurve::FCurveInfo::NumKeysMask;
  old.GetFCurveInfo(&info);
  if (!(info.minClamp > info.maxClamp)) {
    raw->SetValueWhenNoKeys(info.valueWhenNoKeys);
    raw->SetClampingValues(info.minClamp, info.maxClamp);
  }
  for (unsigned int k = 0; k < info.numKeys; ++k) {
    ZvBaseFCurve::KeyInfo key{};
    key.mask = ZvBaseFCurve::KeyInfo::ParameterMask | ZvBaseFCurve::KeyInfo::RightValueMask;
    if (!old.GetKeyInfoFromIndex(k, &key)) break;
    if (k > 0)
      raw->AppendLinearSegment(ZvPoint2<double>{key.parameter, key.rightValue});
    else if (key.parameter != 0.0)
      raw->CreateKey(key.parameter, key.rightValue);
  }
  return raw;
}

}  // namespace

unsigned int ZvPath2fProp1d::GetBufferSize() const {
  ZvShapeLock guard(*this);
  unsigned int size = ZvPath2f::GetBufferSize() + kBodyFixed;
  for (const ZvPropCurveRecord& r : m_impl->records)
    size += 4 + r.curve->GetBufferSize();
  return size;
}

unsigned int ZvPath2fProp1d::WriteToBuffer(void* buffer) const {
  ZvShapeLock guard(*this);
  const unsigned int size = GetBufferSize();
  ZvByteWriter out(buffer);
  out.U32(size - ZvShape2f_GetBufferBodyLengthSize());
  out.U32(KindPathProp | kVersion);
  ZvPath2f::WriteToBuffer(out.Run(ZvPath2f::GetBufferSize()));
  out.U32(static_cast<std::uint32_t>(m_impl->records.size()));
  for (const ZvPropCurveRecord& r : m_impl->records) {
    out.U32(r.subpathStart);
    r.curve->WriteToBuffer(out.Run(r.curve->GetBufferSize()));
  }
  return static_cast<unsigned int>(out.Written());
}

unsigned int ZvPath2fProp1d::ReadFromBufferBody(const void* body) {
  return ReadBody(static_cast<const unsigned char*>(body), 0, false);
}

unsigned int ZvPath2fProp1d::ReadFromBuffer(const void* buffer, std::size_t size) {
  if (!buffer) return 0;
  ZvByteReader block(buffer, size);
  if (!block.Has(4)) return 0;
  const std::uint32_t length = block.U32();
  if (!block.Has(length) || length > UINT_MAX - 4u) return 0;
  try {
    if (!ReadBody(static_cast<const unsigned char*>(buffer) + 4, length, true)) return 0;
  } catch (...) {
    return 0;
  }
  return length + 4;
}

unsigned int ZvPath2fProp1d::ReadBody(const unsigned char* body, std::size_t size, bool bounded) {
  ZvByteReader in = bounded ? ZvByteReader(body, size) : ZvByteReader(body);
  if (!in.Has(4) || in.U16() != KindPathProp) return 0;
  const std::uint32_t version =
      static_cast<std::uint32_t>(in.U8()) << 16 | static_cast<std::uint32_t>(in.U8()) << 24;
  if (version != 0 && version < kFirstCurrentVersion) return 0;

  // Everything is read into a scratch object and swapped in whole, so that a refusal at any
  // point leaves this one as it was.
  ZvPath2fProp1d read(1);
  if (!in.Has(4)) return 0;
  const unsigned char* pathBlock = body + in.Consumed();
  const std::uint32_t pathLength = in.U32();
  if (!in.Has(pathLength) || pathLength > UINT_MAX - 4u) return 0;
  if (bounded) {
    // The path's reader trusts its block: its point count must fit the stated length first.
    if (pathLength < kPathBodyFixed) return 0;
    const std::uint64_t n = zvLoadLE<4>(pathBlock + 8);
    if (kPathBodyFixed + kPathBytesPerPoint * n > pathLength) return 0;
  }
  const unsigned int pathBody = read.ZvPath2f::ReadFromBufferBody(pathBlock + 4);
  if (pathBody == 0) return 0;
  if (bounded && (read.currentSubpathOpen > 1 ||
                  !zv_path::IsWellFormedBlock(read.codes.data, read.codes.size)))
    return 0;
  in.Skip(pathLength);

  if (!in.Has(4)) return 0;
  const std::uint32_t count = in.U32();
  if (!in.Has(static_cast<std::uint64_t>(kRecordFixed) * count)) return 0;
  if (bounded) read.m_impl->records.reserve(count);
  unsigned int result = pathBody + kBodyFixed;
  for (std::uint32_t i = 0; i < count; ++i) {
    if (!in.Has(kRecordFixed)) return 0;
    const unsigned int start = in.U32();
    const unsigned char* curveBlock = body + in.Consumed();
    const std::uint32_t curveLength = in.U32();
    if (!in.Has(curveLength) || curveLength > UINT_MAX - 4u) return 0;
    if (bounded) {
      // Every operation walks subpaths and records side by side: a record must name a subpath
      // start, after the record before it.
      const std::vector<ZvPropCurveRecord>& records = read.m_impl->records;
      if (start >= read.codes.size || (read.codes[start] & zv_path::kCodeMask) != zv_path::kStart ||
          (!records.empty() && start <= records.back().subpathStart))
        return 0;
    }
    std::unique_ptr<ZvRawFCurve> curve;
    if (version == 0) {
      ZvStdFCurve old(0.0);
      if (!old.ReadFromBuffer(curveBlock, 4u + curveLength)) return 0;
      curve = ConvertOldCurve(old);
    } else {
      curve = std::make_unique<ZvRawFCurve>(0.0, 1.0);
      if (!curve->ReadFromBuffer(curveBlock, 4u + curveLength)) return 0;
    }
    in.Skip(curveLength);
    // Stored order is kept as it stands: blocks come from writers that keep the list in order.
    read.m_impl->records.push_back(ZvPropCurveRecord{start, std::move(curve)});
    result += 4 + curveLength;
  }
  ZvShapeLock guard(*this);
  SwapGeometry(read);
  m_impl->Swap(*read.m_impl);
  return result;
}

// The layout of the standard curve's block, shared by its writer and its reader.
//
// Each version added a block after the keys that opens with a tag, the stamp of the version that
// introduced it; a reader expects exactly the tags of the stamp it was given.
#ifndef ZV_FCURVE_STD_FCURVE_BUFFER_H
#define ZV_FCURVE_STD_FCURVE_BUFFER_H

namespace zv_std_buffer {

// The stamp written today.
constexpr unsigned int kStamp = 264;
// The oldest layout, from before the stamps counted from 256: 64-byte key records.
constexpr unsigned int kOldestStamp = 1;
constexpr unsigned int kFirstStamp = 256;

// Key flags; one byte each before 261, then the whole 16-bit word.
constexpr unsigned int kFlagsTag = 257;
constexpr unsigned int kWideFlagsStamp = 261;
// Extrapolation, read-only flag, the keys' extra bytes and the user data.
constexpr unsigned int kSettingsTag = 259;
constexpr unsigned int kTangentConstraintTag = 262;
constexpr unsigned int kTimeCurveTag = 264;

// Seven doubles, the segment kind and three zero bytes.
constexpr unsigned int kKeyRecordSize = 60;
// Body length, stamp, kind, three doubles, first segment kind, key count.
constexpr unsigned int kHeaderSize = 44;
// The tags and their one-byte settings (extrapolation and read-only share one tag).
constexpr unsigned int kTrailerSize = 4 + 4 + 2 + 4 + 1 + 4 + 1;
// Bytes that the length covers beyond what is written: kept so that blocks keep their size.
constexpr unsigned int kUnwrittenTail = 4;

}  // namespace zv_std_buffer

#endif

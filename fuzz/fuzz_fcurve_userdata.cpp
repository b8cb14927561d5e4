// Feeds arbitrary bytes to the bounded reader of a user data set and, when a set comes out,
// checks that it writes a block that reads back to the same bytes, and that the items found by
// identifier are the ones walked in order.
#include <zv/fcurve_userdata.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace {
std::vector<unsigned char> Body(const CFCUserDataSet& set) {
  std::vector<unsigned char> block(set.GetBufferSize());
  if (set.WriteToBuffer(block.data()) != block.size()) std::abort();
  return std::vector<unsigned char>(block.begin() + 4, block.end());
}
}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  CFCUserDataSet set;
  const unsigned int used = set.ReadFromBufferBody(data, static_cast<unsigned int>(size));
  if (used == 0) {
    if (!set.IsEmpty()) std::abort();  // a refused block leaves nothing behind
    return 0;
  }
  if (used > size) std::abort();
  const std::vector<unsigned char> body = Body(set);
  CFCUserDataSet again;
  if (again.ReadFromBufferBody(body.data(), static_cast<unsigned int>(body.size())) != body.size())
    std::abort();
  if (Body(again) != body) std::abort();
  for (auto it = set.begin(); it != set.end(); ++it) {
    const CFCUserDataValue* found = again.FindUserData(it->first.GetUID());
    if (found == nullptr || found->GetSize() != it->second.GetSize()) std::abort();
    if (found->GetSize() != 0 &&
        std::memcmp(found->GetData(), it->second.GetData(), found->GetSize()) != 0)
      std::abort();
  }
  return 0;
}

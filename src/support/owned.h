// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Owners for what C libraries hand out.
#ifndef MEDIIDX_SUPPORT_OWNED_H_
#define MEDIIDX_SUPPORT_OWNED_H_

#include <tavocore.h>
#include <tavodb.h>
#include <tavosdk.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace mediidx {

template <auto Release>
struct Releaser {
  template <class T>
  void operator()(T* handle) const noexcept {
    Release(handle);
  }
};

template <class T, auto Release>
using Owned = std::unique_ptr<T, Releaser<Release>>;

using OwnedText = Owned<char, std::free>;  ///< What malloc made, filled statements among it.
using OwnedFormat = Owned<char, TLIBCStrPut>;
using OwnedFile = Owned<std::FILE, std::fclose>;
using OwnedPipe = Owned<std::FILE, TLIBCPclose>;
using OwnedResult = Owned<tavodb_result, TAVODBFreeResult>;
using OwnedList = Owned<TLIBSZLIST, TLIBCSzListFree>;
using OwnedHash = Owned<TLIBSZHASH, TLIBCSzHashFree>;
using OwnedShare = Owned<TAVOSHARE, TAVOShareFree>;
using OwnedUser = Owned<TAVOUSER, TAVOUserFree>;
using OwnedHomeCheck = Owned<TAVOHOMECHECK, TAVOHomeCheckResultFree>;

/// Lends an empty owner to a C call that fills a pointer: `Get(name, out(share))`. The owner holds
/// what came at the end of the whole expression, so it must not be looked at within it.
template <class Owner>
class Out {
 public:
  explicit Out(Owner& owner) : owner_(owner) {}
  Out(const Out&) = delete;
  Out& operator=(const Out&) = delete;
  ~Out() { owner_.reset(handle_); }
  operator typename Owner::pointer *() { return &handle_; }

 private:
  Owner& owner_;
  typename Owner::pointer handle_ = nullptr;
};

template <class Owner>
Out<Owner> out(Owner& owner) {
  return Out<Owner>(owner);
}

}  // namespace mediidx

#endif

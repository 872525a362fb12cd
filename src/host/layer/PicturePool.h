#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <optional>

#include "host/PictureMemory.h"
#include "host/layer/WaylandHandles.h"
#include "protocol/Messages.h"

namespace nimbo {

/// Pictures that the widget draws and the compositor shows, in the memory that all three share: while one is shown the
/// next is drawn beside it. Main thread only.
class PicturePool {
 public:
  /// `memory` outlives this; `hasRoom` hears when there is room again where there was none.
  PicturePool(wl_shm* shm, const PictureMemory& memory, std::function<void()> hasRoom);

  /// Where the next picture may be drawn; absent while the compositor holds all.
  std::optional<protocol::RenderParams> room();
  /// The picture that was drawn in the `room` given last, whose size is a multiple of `unit` pixels; what is beyond
  /// that is not shown. It is the compositor's until that gives it back. Null where no picture is awaited, as of
  /// another pool, or there can be none such.
  wl_buffer* take(const protocol::Rendered& drawn, std::int32_t unit);

 private:
  static constexpr std::size_t kPlaces = 2;
  static constexpr std::uint64_t kCapacity = PictureMemory::kSize / kPlaces;
  struct Place {
    WaylandHandle<wl_buffer> buffer;
    bool isHeld = false;  // by the compositor
    PicturePool* pool = nullptr;
  };
  struct Events;

  wl_shm* _shm;
  const PictureMemory& _memory;
  std::function<void()> _hasRoom;
  WaylandHandle<wl_shm_pool> _pool;
  std::uint64_t _size = 0;  // bytes of the file that the pool spans
  std::array<Place, kPlaces> _places;
  std::optional<std::size_t> _awaited;
  bool _lacksRoom = false;  // and somebody waits for it
};

}  // namespace nimbo

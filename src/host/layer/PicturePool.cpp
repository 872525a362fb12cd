#include "host/layer/PicturePool.h"

#include <wayland-client.h>

#include <algorithm>
#include <utility>

namespace nimbo {

struct PicturePool::Events {
  static constexpr wl_buffer_listener kBuffer{.release = [](void* data, wl_buffer*) {
    Place& place = *static_cast<Place*>(data);
    place.isHeld = false;
    if (std::exchange(place.pool->_lacksRoom, false)) place.pool->_hasRoom();
  }};
};

PicturePool::PicturePool(wl_shm* shm, const PictureMemory& memory, std::function<void()> hasRoom)
    : _shm(shm), _memory(memory), _hasRoom(std::move(hasRoom)) {
  for (Place& place : _places) place.pool = this;
}

std::optional<protocol::RenderParams> PicturePool::room() {
  const auto free = std::ranges::find(_places, false, &Place::isHeld);
  _lacksRoom = free == _places.end();
  if (_lacksRoom) return std::nullopt;
  _awaited = static_cast<std::size_t>(free - _places.begin());
  return protocol::RenderParams{.offset = *_awaited * kCapacity, .capacity = kCapacity};
}

wl_buffer* PicturePool::take(const protocol::Rendered& drawn, std::int32_t unit) {
  const auto index = std::exchange(_awaited, std::nullopt);
  const std::uint64_t bytes = PictureMemory::bytesOf(drawn);
  const std::int32_t width = drawn.width - drawn.width % unit, height = drawn.height - drawn.height % unit;
  if (!index || bytes == 0 || bytes > kCapacity || width <= 0 || height <= 0) return nullptr;
  const std::uint64_t offset = *index * kCapacity;
  // The pool only grows, over the file that is as large as it can become.
  const auto size = static_cast<std::int32_t>(std::max(_size, offset + bytes));
  if (!_pool)
    _pool.reset(wl_shm_create_pool(_shm, _memory.descriptor(), size));
  else if (offset + bytes > _size)
    wl_shm_pool_resize(_pool.get(), size);
  _size = static_cast<std::uint64_t>(size);

  Place& place = _places[*index];
  place.buffer.reset(wl_shm_pool_create_buffer(_pool.get(), static_cast<std::int32_t>(offset), width, height,
                                               drawn.stride, WL_SHM_FORMAT_ARGB8888));
  wl_buffer_add_listener(place.buffer.get(), &Events::kBuffer, &place);
  place.isHeld = true;
  return place.buffer.get();
}

}  // namespace nimbo

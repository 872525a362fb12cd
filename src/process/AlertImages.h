#pragma once

#include <stop_token>
#include <string>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"

namespace nimbo {

/// Where the image of an incident is, by its number in decimal, of those that the last lookup found. An error where it
/// has none, or where its feed comes by https and the image does not.
Outcome<FeedAddress> imageOfIncident(const std::string& incident, const GTFSTransitLineService& service);

/// The image at an address, scaled down to a width in pixels; its file has 4 MiB at most. No key of a feed goes along.
/// Blocks its thread, which `stop` frees soon; one image at a time is decoded. Any thread. Throws LatePartMissing.
Outcome<PictureRef> fetchImage(const FeedAddress& address, std::uint32_t width, const std::stop_token& stop);

}  // namespace nimbo

// A recording's events where they were measured, for GIS tools: GeoJSON (RFC 7946) and KML
// 2.2, which QGIS (through GDAL) and Google Earth open. Only events with a position (the latest
// fix no older than two seconds, see PositionJoin) become points; the others are counted.
#pragma once

#include <ostream>
#include <string>

#include "recordings/RecordingReader.h"

namespace pyx {

// A FeatureCollection: one Point per event, [lon, lat(, altitude)] in WGS 84, with properties
// time, metric, property, the serving level at that moment (serving_technology,
// serving_quantity, serving_dBm, serving_class) and the event's decoded fields as the csv
// names them. Returns the exit code (1 for a damaged recording).
int exportGeoJson(const recordings::RecordingReader& reader,
                  const recordings::RecordingReader::Filter& filter, const std::string& title,
                  std::ostream& out, std::ostream& err);

// A Document: one Placemark per event, styled by the serving level's class at that moment
// (grey before any is known), with the level and the event's fields in its description, then
// the track of the fixes in the time asked for as one LineString.
int exportKml(const recordings::RecordingReader& reader,
              const recordings::RecordingReader::Filter& filter, const std::string& title,
              std::ostream& out, std::ostream& err);

}  // namespace pyx

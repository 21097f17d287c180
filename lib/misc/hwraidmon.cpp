// Readings of the hardware monitors, from the report of the RAID controller.
#include "common/diag.h"
#include "common/owner.h"
#include "common/raid_report.h"
#include "common/report_turn.h"
#include "zav_api.h"

namespace {

constexpr int kCardItems = 4; // of an expansion unit all readings are items

// Reads up to the monitor line behind the marker.
int read_monitor(const char *function, zav::MonitorReader &reader) {
    zav::ReportTurn turn;
    if (const int rc = turn.take(function, zav::ReportTurn::kKey); rc != ZAV_RC_OK)
        return rc;
    zav::File report(zav::kReportPath, "re");
    if (!report) {
        turn.end();
        ZAV_TRACE(zav::kTraceFailure, "%s() - 1. Open %s File Error!\n", function,
                  zav::kReportPath);
        return ZAV_RC_ERR_ENOENT;
    }
    for (char piece[zav::kReportPiece]; report.line(piece, sizeof piece);)
        if (!reader.take(piece))
            break;
    return ZAV_RC_OK;
}

template <class Number>
int choose(const zav::MonitorReader &reader, int item, int items, Number *value) {
    const bool known = item >= 0 && item < items;
    *value = known ? static_cast<Number>(reader.reading(item)) : Number{0};
    return known ? ZAV_RC_OK : ZAV_RC_ERR_EINVAL;
}

} // namespace

int zavGetRBODHwMon(int rbodid, int item, float *value) {
    if (value == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::MonitorReader reader(zav::Marker::unit(rbodid));
    if (const int rc = read_monitor(__func__, reader); rc != ZAV_RC_OK)
        return rc;
    if (!reader.marker_found()) // a unit without a monitor line reads 0
        return ZAV_RC_ERR_ENODEV;
    return choose(reader, item, zav::MonitorReader::kReadings, value);
}

int zavGetRaidCardHwMon(int item, double *value) {
    if (value == nullptr)
        return ZAV_RC_ERR_EINVAL;
    zav::MonitorReader reader(zav::Marker::controller());
    if (const int rc = read_monitor(__func__, reader); rc != ZAV_RC_OK)
        return rc;
    if (!reader.line_found())
        return ZAV_RC_ERR_ENODEV;
    return choose(reader, item, kCardItems, value);
}

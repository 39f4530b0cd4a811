// NAS, bearer and SIM reports of the drive: the subscriber's identities as the network and the
// SIM card hold them.
#include <algorithm>
#include <array>
#include <memory>
#include <string>
#include <string_view>

#include "messages/Messages.h"
#include "sources/sim/Identities.h"
#include "sources/sim/PayloadHelpers.h"
#include "sources/sim/Payloads.h"
#include "sources/sim/SimFiles.h"

namespace pyx::sim::payloads {

namespace {

constexpr std::int32_t kNormalService = 0;
constexpr std::int32_t kMmStatusUpdated = 1;
constexpr std::int32_t kGprsStatusUpdated = 0;
constexpr std::int32_t kEpsStatusUpdated = 0;
constexpr std::int32_t kCsPsMode1 = 2;
constexpr std::int32_t kGmmProcNone = 10;
constexpr std::int32_t kPdpIPv4 = 0;
constexpr std::int32_t kPdpIPv6 = 1;
constexpr std::int32_t kPdpIPv4v6 = 2;
constexpr std::uint32_t kRac = 17;

Bytes plmnOf(const Subscriber& sub) {
    return encodePlmn(sub.mcc, sub.mnc, sub.mncDigits);
}

void append(Bytes& out, const Bytes& more) {
    // Growing first also keeps g++ 12 at -O3 from a false "reading from a region of size 0".
    out.reserve(out.size() + more.size());
    out.insert(out.end(), more.begin(), more.end());
}
void appendBigEndian(Bytes& out, std::uint32_t value, int bytes) {
    for (int i = bytes - 1; i >= 0; --i) out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
}

std::shared_ptr<KCellularLocationAreaId> lai(const Subscriber& sub, std::uint32_t lac) {
    auto id = std::make_shared<KCellularLocationAreaId>();
    id->setEncodedPlmn(plmnOf(sub));
    id->setLac(lac);
    return id;
}

std::shared_ptr<KCellularTrackingAreaId> tai(const Subscriber& sub, std::uint32_t tac) {
    auto id = std::make_shared<KCellularTrackingAreaId>();
    id->setEncodedPlmn(plmnOf(sub));
    id->setTac(tac);
    return id;
}

// The address the network gave this subscriber: a 10.x.y.z and a 2001:db8:... interface.
Bytes ipv4Address(const Subscriber& sub) {
    return Bytes{10, static_cast<std::uint8_t>(64 + (sub.tmsi & 0x3F)),
                 static_cast<std::uint8_t>(sub.tmsi >> 8),
                 static_cast<std::uint8_t>(sub.tmsi >> 16 | 1)};
}

Bytes ipv6Address(const Subscriber& sub, std::uint8_t subnet) {
    Bytes a{0x20, 0x01, 0x0d, 0xb8, 0x00, subnet, 0x00, 0x00};
    appendBigEndian(a, sub.mTmsi, 4);
    appendBigEndian(a, sub.pTmsi, 4);
    return a;
}

}  // namespace

Bytes mmCommonInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    KCellularMmCommonInfo m;
    m.setTimestamp(timestamp);
    m.setImsi(encodeImsi(sub.imsi, false));
    for (const std::uint32_t mnc : {sub.mnc, sub.mnc + 1}) {
        auto plmn = std::make_shared<Plmn>();
        plmn->setEncodedPlmn(encodePlmn(sub.mcc, mnc, sub.mncDigits));
        m.addEplmnList(std::move(plmn));
    }
    m.addRoamingFlaiList(lai(sub, s.umtsLac + 7));
    m.addRegProvFlaiList(lai(sub, s.umtsLac + 9));
    m.addRoamingFtaiList(tai(sub, s.tac + 11));
    m.addRegProvFtaiList(tai(sub, s.tac + 13));
    return m.data();
}

Bytes activeBearers(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    KCellularActivatedBearerContexts m;
    m.setTimestamp(timestamp);
    m.setBearerContextCount(2);

    auto internet = std::make_shared<BearerContext>();
    internet->setCid(1);
    internet->setNsapi(5);
    internet->setApn("internet");
    internet->setPdpType(kPdpIPv4v6);
    Bytes both = ipv4Address(sub);
    append(both, ipv6Address(sub, 0x10));
    internet->setPdpAddr(std::move(both));
    internet->setPrimaryDnsType(kPdpIPv4);
    internet->setPrimaryDnsAddr(Bytes{10, 64, 0, 1});
    internet->setSecondaryDnsType(kPdpIPv4);
    internet->setSecondaryDnsAddr(Bytes{10, 64, 0, 2});
    internet->setIsAddrIratMobile(true);
    m.addBearerContext(std::move(internet));

    auto ims = std::make_shared<BearerContext>();
    ims->setCid(2);
    ims->setNsapi(6);
    ims->setApn("ims");
    ims->setPdpType(kPdpIPv6);
    ims->setPdpAddr(ipv6Address(sub, 0x20));
    ims->setPrimaryDnsType(kPdpIPv6);
    ims->setPrimaryDnsAddr(
        Bytes{0x20, 0x01, 0x0d, 0xb8, 0x00, 0x01, 0, 0, 0, 0, 0, 0, 0, 0, 0x00, 0x53});
    ims->setSecondaryDnsType(kPdpIPv6);
    ims->setSecondaryDnsAddr(
        Bytes{0x20, 0x01, 0x0d, 0xb8, 0x00, 0x02, 0, 0, 0, 0, 0, 0, 0, 0, 0x00, 0x53});
    ims->setIsAddrIratMobile(true);
    m.addBearerContext(std::move(ims));
    return m.data();
}

Bytes emmContext(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    KCellularEmmContext m;
    m.setTimestamp(timestamp);
    m.setRegStatus(kNormalService);
    m.setUpdateStatus(kEpsStatusUpdated);
    m.setUeOpMode(kCsPsMode1);
    m.addTaiList(tai(sub, s.tac));
    m.addTaiList(tai(sub, s.tac + 1));
    auto guti = std::make_shared<Guti>();
    guti->setMmegi(sub.mmegi);
    guti->setMmec(sub.mmec);
    guti->setMTmsi(sub.mTmsi + s.trackingAreaUpdates);
    m.setGuti(std::move(guti));
    m.setRejectCause(0);
    m.setRegProc(s.emmRegProc);
    m.setT3412DurS(3240);
    m.setIsImsVoiceSupported(true);
    m.setIsEmergBearerSupported(true);
    return m.data();
}

Bytes mmContext(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    KCellularMmContext m;
    m.setTimestamp(timestamp);
    m.setRegStatus(kNormalService);
    m.setUpdateStatus(kMmStatusUpdated);
    m.setLai(lai(sub, s.umtsLac));
    m.setTmsi(sub.tmsi);
    m.setT3212DurS(10800);
    m.setProcFailureCause(0);
    m.setRejectCause(0);
    m.setIsCombinedProc(true);
    return m.data();
}

Bytes gmmContext(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    KCellularGmmContext m;
    m.setTimestamp(timestamp);
    m.setRegStatus(kNormalService);
    m.setUpdateStatus(kGprsStatusUpdated);
    auto rai = std::make_shared<RoutingAreaId>();
    rai->setEncodedPlmn(plmnOf(sub));
    rai->setLac(s.umtsLac);
    rai->setRac(kRac);
    m.setRai(std::move(rai));
    m.setPTmsi(sub.pTmsi);
    m.setT3312DurS(3240);
    m.setProcFailureCause(0);
    m.setRejectCause(0);
    m.setRegProc(kGmmProcNone);
    return m.data();
}

Bytes simCardFiles(const DriveState& s, std::uint64_t timestamp, Random&) {
    const Subscriber& sub = s.subscriber;
    const Bytes plmn = plmnOf(sub);
    KCellularSimCardFiles m;
    m.setTimestamp(timestamp);

    m.addEfList(elementaryFile(kEfIccid, encodeIccid(sub.iccid)));
    m.addEfList(elementaryFile(kEfImsi, encodeImsi(sub.imsi, true)));

    Bytes spn(17, 0xFF);  // display condition, then the name, F-padded to 16 characters
    spn[0] = 0x01;
    const std::string_view name = "Pyxon Test";
    std::copy(name.begin(), name.end(), spn.begin() + 1);
    m.addEfList(elementaryFile(0x6F46, std::move(spn)));  // SPN

    m.addEfList(elementaryFile(kEfAd, adContent(sub.mncDigits)));

    const int accessClass = sub.imsi.back() - '0';
    m.addEfList(elementaryFile(
        0x6F78, Bytes{static_cast<std::uint8_t>(accessClass >= 8 ? 1 << (accessClass - 8) : 0),
                      static_cast<std::uint8_t>(accessClass < 8 ? 1 << accessClass : 0)}));
    m.addEfList(elementaryFile(0x6F31, Bytes{0x05}));  // HPPLMN search period: 30 minutes

    Bytes fplmn = encodePlmn(sub.mcc, sub.mnc + 2, sub.mncDigits);
    fplmn.resize(12, 0xFF);
    m.addEfList(elementaryFile(0x6F7B, std::move(fplmn)));  // FPLMN

    Bytes loci;  // TMSI, LAI, TMSI time, update status
    appendBigEndian(loci, sub.tmsi, 4);
    append(loci, plmn);
    appendBigEndian(loci, s.umtsLac, 2);
    loci.push_back(0xFF);
    loci.push_back(0x00);
    m.addEfList(elementaryFile(0x6F7E, std::move(loci)));

    Bytes psloci;  // P-TMSI, P-TMSI signature, RAI, update status
    appendBigEndian(psloci, sub.pTmsi, 4);
    appendBigEndian(psloci, sub.tmsi & 0xFFFFFF, 3);
    append(psloci, plmn);
    appendBigEndian(psloci, s.umtsLac, 2);
    psloci.push_back(static_cast<std::uint8_t>(kRac));
    psloci.push_back(0x00);
    m.addEfList(elementaryFile(0x6F73, std::move(psloci)));

    Bytes epsloci{0x0B, 0xF6};  // GUTI, last visited TAI, EPS update status
    append(epsloci, plmn);
    appendBigEndian(epsloci, sub.mmegi, 2);
    appendBigEndian(epsloci, sub.mmec, 1);
    appendBigEndian(epsloci, sub.mTmsi + s.trackingAreaUpdates, 4);
    append(epsloci, plmn);
    appendBigEndian(epsloci, s.tac, 2);
    epsloci.push_back(0x00);
    m.addEfList(elementaryFile(0x6FE3, std::move(epsloci)));
    return m.data();
}

}  // namespace pyx::sim::payloads

// NAS, bearer and SIM message specifics.
#include <gtest/gtest.h>

#include "TestBytes.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::bytes;
using test::key;
using test::operator+;

TEST(MmContext, UpdateStatus0ShowsUnknown) {
    const auto m = KCellularMmContext::initWithData(key(3, 0) + bytes({0}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"update_status", "(unknown: 0)"}}));
}

TEST(GmmAndEmmContext, UpdateStatus0ShowsUpdated) {
    const auto gmm = KCellularGmmContext::initWithData(key(3, 0) + bytes({0}));
    const auto emm = KCellularEmmContext::initWithData(key(3, 0) + bytes({0}));
    ASSERT_TRUE(gmm.has_value());
    ASSERT_TRUE(emm.has_value());
    EXPECT_EQ(gmm->dictionaryRepresentation(), (Dict{{"update_status", "GPRS_STATUS_UPDATED"}}));
    EXPECT_EQ(emm->dictionaryRepresentation(), (Dict{{"update_status", "EPS_STATUS_UPDATED"}}));
}

TEST(RoutingAreaId, HasNoField2) {
    const auto m = RoutingAreaId::initWithData(key(2, 0) + bytes({5}) + key(3, 0) + bytes({6}) +
                                               key(4, 0) + bytes({7}));
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), (Dict{{"lac", 6U}, {"rac", 7U}}));
    RoutingAreaId out;
    out.setLac(6);
    out.setRac(7);
    EXPECT_EQ(out.data(), bytes({0x18, 0x06, 0x20, 0x07}));
}

TEST(ActivatedBearerContexts, CountAndListAreIndependent) {
    KCellularActivatedBearerContexts m;
    m.setBearerContextCount(3);
    auto bearer = std::make_shared<BearerContext>();
    bearer->setCid(1);
    bearer->setApn(std::string("ims"));
    bearer->setPdpType(PDP_TYPE_IPv4v6);
    m.addBearerContext(bearer);
    const auto back = KCellularActivatedBearerContexts::initWithData(m.data());
    ASSERT_TRUE(back.has_value());
    EXPECT_EQ(back->bearerContextCount(), 3U);
    EXPECT_EQ(back->bearerContextsCount(), 1U);
    EXPECT_EQ(back->dictionaryRepresentation(),
              (Dict{{"bearer_context_count", 3U},
                    {"bearer_contexts",
                     Array{Dict{{"cid", 1U}, {"apn", "ims"}, {"pdp_type", "PDP_TYPE_IPv4v6"}}}}}));
}

TEST(ElementaryFile, ContentIsShownAsRawBytes) {
    const auto m =
        ElementaryFile::initWithData(bytes({0x08, 0xE2, 0x5D, 0x12, 0x03, 0x98, 0x10, 0x00}));
    ASSERT_TRUE(m.has_value());
    const Dict d = m->dictionaryRepresentation();
    EXPECT_EQ(d, (Dict{{"ef_id", 0x2EE2U}, {"content", bytes({0x98, 0x10, 0x00})}}));
    EXPECT_EQ(d.find("content")->description(), "<981000>");
}

TEST(MmCommonInfo, ImsiAndPlmnsAreBytes) {
    KCellularMmCommonInfo m;
    m.setImsi(bytes({0x09, 0x10}));
    auto plmn = std::make_shared<Plmn>();
    plmn->setEncodedPlmn(bytes({0x13, 0x00, 0x14}));
    m.addEplmnList(plmn);
    EXPECT_EQ(m.dictionaryRepresentation(),
              (Dict{{"imsi", bytes({0x09, 0x10})},
                    {"eplmn_list", Array{Dict{{"encoded_plmn", bytes({0x13, 0x00, 0x14})}}}}}));
}

TEST(EmmContext, RejectCauseUsesTheEmmTable) {
    KCellularEmmContext m;
    m.setRejectCause(EMM_CAUSE_CONGESTION);
    m.setRegProc(EMM_PROC_TAU);
    auto guti = std::make_shared<Guti>();
    guti->setMTmsi(0xC0FFEE);
    m.setGuti(guti);
    EXPECT_EQ(m.dictionaryRepresentation(), (Dict{{"guti", Dict{{"m_tmsi", 0xC0FFEEU}}},
                                                  {"reject_cause", "EMM_CAUSE_CONGESTION"},
                                                  {"reg_proc", "EMM_PROC_TAU"}}));
}

TEST(GmmContext, RejectCauseAndRegProcUseTheMmTables) {
    KCellularGmmContext m;
    m.setRejectCause(KNAS_MM_REJ_CAUSE_CONGESTION);
    m.setRegProc(KNAS_MM_REG_PROC_COMBINED_TAU);
    m.setProcFailureCause(KNAS_MM_PROC_FAILURE_CAUSE_OTHER);
    EXPECT_EQ(m.dictionaryRepresentation(),
              (Dict{{"proc_failure_cause", "KNAS_MM_PROC_FAILURE_CAUSE_OTHER"},
                    {"reject_cause", "KNAS_MM_REJ_CAUSE_CONGESTION"},
                    {"reg_proc", "KNAS_MM_REG_PROC_COMBINED_TAU"}}));
}

}  // namespace
}  // namespace pyx

// Construction, the held automation objects and the instrument's identification.

#include "analyzer/NetworkAnalyzerClass.h"
#include "analyzer/automation/BackendFactory.h"
#include "platform/NumberText.h"

using automation::queryInterface;

CNetworkAnalyzer::CNetworkAnalyzer(const std::string& hostName, platform::OperatorUi& ui,
                                   platform::Clock& clock)
    : m_ui(ui), m_clock(clock), m_hostName(hostName) {
    std::shared_ptr<automation::Object> created = automation::BackendFactory::create(hostName);
    if (!created) {
        throw std::string(
            "The software driver\r\nassociated with that com object was not found or could not "
            "be properly loaded.");
    }
    m_pTVAap = queryInterface<automation::Application>(created);
    created.reset();
    if (!m_pTVAap) {
        m_ui.messageBox({"Unable to create COM object for TVA Application " + hostName,
                         "Critical Error", platform::Buttons::Ok, platform::BoxNone});
        m_quitRequested = true;
        return;
    }
    m_pParser = queryInterface<automation::ScpiParser>(m_pTVAap->scpiParser());
    if (!m_pParser) {
        m_ui.messageBox(
            {"could not create TVA SCPI Parser", "", platform::Buttons::Ok, platform::BoxNone});
    }
}

CNetworkAnalyzer::~CNetworkAnalyzer() {
    clearmeasurements();
    // Released in the reverse order of acquisition, as the application expects.
    m_pCurrentMeasurementData.reset();
    m_pCurrentMeasurementObject.reset();
    m_pSegmentTable.reset();
    m_pSegmentTableObject.reset();
    m_pActiveChannel.reset();
    m_pChannelObject.reset();
    m_pParser.reset();
    m_pTVAap.reset();
}

std::shared_ptr<automation::Application> CNetworkAnalyzer::application() const {
    if (!m_pTVAap) {
        throw std::string("m_pTVAap != NULL");
    }
    return m_pTVAap;
}

std::shared_ptr<automation::Channel> CNetworkAnalyzer::channel() const {
    if (!m_pActiveChannel) {
        throw std::string("m_pActiveChannel != NULL");
    }
    return m_pActiveChannel;
}

std::shared_ptr<automation::SegmentTable> CNetworkAnalyzer::segmenttable() const {
    if (!m_pSegmentTable) {
        throw std::string("m_pSegmentTable != NULL");
    }
    return m_pSegmentTable;
}

std::string CNetworkAnalyzer::readmodel(bool query) {
    if (!query) {
        return m_model;
    }
    const std::string reply = sendscpi("*IDN?");
    const auto first = reply.find(',');
    const auto second = first == std::string::npos ? first : reply.find(',', first + 1);
    if (second == std::string::npos) {
        throw std::string(
            "CNetworkAnalyzer::readmodel cannot find the model field in the *IDN? "
            "reply \"" +
            reply + "\" (maker, model, serial, firmware expected)");
    }
    m_model = reply.substr(first + 1, second - first - 1);
    m_identificationModel = m_model;

    const bool bVersion =
        m_model.find("2B") != std::string::npos || m_model.find("7B") != std::string::npos;
    if (m_model.starts_with("T3") && bVersion) {
        const std::string catalog = sendscpi("SYST:CONF:MWAV:CONF:CAT?");
        if (catalog.find(',') != std::string::npos) {
            const std::string active = sendscpi("SYST:CONF:MWAV:CONF:ACT?");
            if (active.find("Broadband") != std::string::npos) {
                m_model = active.find("T3950A") != std::string::npos ? "T3950A" : "T3951A";
            }
        }
    }
    return m_model;
}

bool CNetworkAnalyzer::ismmwave() const {
    return m_model != m_identificationModel;
}

std::vector<std::string> CNetworkAnalyzer::readoptions(bool query) {
    if (query) {
        m_options.clear();
        const std::string reply = sendscpi("*opt?");
        const auto open = reply.find('"');
        const auto close = open == std::string::npos ? open : reply.find('"', open + 1);
        if (close == std::string::npos) {
            throw std::string(
                "CNetworkAnalyzer::readoptions cannot find the quoted option list "
                "in the *opt? reply \"" +
                reply + "\"");
        }
        std::string rest = reply.substr(open + 1, close - open - 1);
        for (auto comma = rest.find(','); comma != std::string::npos; comma = rest.find(',')) {
            m_options.push_back(rest.substr(0, comma));
            rest.erase(0, comma + 1);
        }
        m_options.push_back(rest.empty() ? "No Options" : rest);

        if (ismmwave()) {
            const auto has = [this](const char* base) {
                return m_identificationModel.find(base) != std::string::npos;
            };
            if (has("T3872")) {
                // Only the last code of the reply is looked at, as the analyzer's own tools do.
                m_options.push_back(rest.find("029") != std::string::npos ? "402" : "401");
            } else if (has("T3877")) {
                m_options.push_back("403");
            } else if (has("T3467")) {
                m_options.push_back("202");
            } else if (has("T3462")) {
                m_options.push_back("201");
            } else {
                throw std::string("CNetworkAnalyzer::readoptions " + m_identificationModel +
                                  "is not a recognized base TVA model for " + m_model);
            }
        }
    }
    return m_options;
}

int CNetworkAnalyzer::readportcount(bool query) {
    if (query) {
        m_portCount = platform::leadingInteger(sendscpi("diag:portcount?"));
    }
    return m_portCount;
}

void CNetworkAnalyzer::eeupdatehw() {
    sendscpi("diag:eeupdatehw");
}

#include "config/Calibration.h"

#include "config/TextMatch.h"

namespace {

std::string TrimBlanks(const std::string& text) {
    std::size_t first = text.find_first_not_of(' ');
    if (first == std::string::npos) {
        return {};
    }
    return text.substr(first, text.find_last_not_of(' ') - first + 1);
}

}  // namespace

CCalibration::CCalibration(const std::string& name) : m_name(ToUpper(TrimBlanks(name))) {}

void CCalibration::AddSub(const CSub& sub) {
    std::size_t i = 0;
    for (; i < m_subs.size(); ++i) {
        if (m_subs[i].GetPosition() == sub.GetPosition()) {
            if (m_subs[i].GetName() != sub.GetName()) {
                throw "CCalibration::AddSub Unable to add sub " + sub.GetName() +
                    " position all ready Exists";
            }
            m_subs[i] = sub;
            return;
        }
        if (m_subs[i].GetPosition() > sub.GetPosition()) {
            break;
        }
    }
    auto offset = static_cast<std::ptrdiff_t>(i);
    m_subs.insert(m_subs.begin() + offset, sub);
    m_subNames.insert(m_subNames.begin() + offset, sub.GetName());
}

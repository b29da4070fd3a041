// A set of control points with its coordinate reference system, description, metadata and
// history.
#ifndef VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINTCONTAINER_H
#define VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINTCONTAINER_H

#include <map>
#include <memory>  // std::unique_ptr
#include <string>
#include <vector>

#include "vrkframework/basic/kubo/controlpoints/controlpoint.h"
#include "vrkframework/basic/kubo/controlpoints/historyevent.h"
#include "vrkframework/basic/kubo/kuboapi.h"
#include "vrkframework/platform/caseinsensitivecompare.h"
#include "vrkframework/platform/crs.h"

namespace kora::kubo {

/// Control points and what describes them as a whole. The container owns a clone of the
/// coordinate reference system it is given (none by default) and destroys it when it is
/// replaced or the container goes.
///
/// The history is not copied with the rest: a copy-constructed container starts with an
/// empty history and an assigned one keeps its own; copy it with `SetHistory`. A moved
/// container hands over everything, history included, so returning a container or growing
/// a vector of them loses nothing; assigning from a moved one follows the copy rules.
class KUBO_API ControlPointContainer {
public:
    /// Key/value metadata; keys are ordered and matched without regard to letter case.
    using KVPMetadata =
        std::map<std::string, std::string, kora::datasources::detail::CaseInsensitiveCompare>;

    ControlPointContainer();
    /// Copies all but the history, which starts empty.
    /// @throws kora::ParameterException as `SetCRS` when the source's CRS now reports 2
    /// dimensions.
    ControlPointContainer(const ControlPointContainer& other);
    /// Copies all but the history, which stays the target's own. A container assigned to
    /// itself only replaces its CRS by a fresh clone.
    /// @throws kora::ParameterException as `SetCRS` when the source's CRS now reports 2
    /// dimensions.
    ControlPointContainer& operator=(const ControlPointContainer& other);
    /// Takes every member, history and CRS included; `other` is left without a CRS.
    ControlPointContainer(ControlPointContainer&& other) noexcept;
    /// As copy assignment: the target keeps its history, and its CRS when `other` has none.
    // NOLINTNEXTLINE(bugprone-exception-escape,performance-noexcept-move-constructor)
    ControlPointContainer& operator=(ControlPointContainer&& other);
    ~ControlPointContainer();

    /// The held clone, or null; the container keeps ownership.
    const kora::ogc::cs::ICRS* GetCRS() const { return m_crs.get(); }
    /// Replaces the held CRS by a clone of `crs` (which may be the held one itself).
    /// @throws kora::ParameterException when `crs` has 2 dimensions; the container then
    /// holds no CRS at all.
    void SetCRS(const kora::ogc::cs::ICRS& crs);

    /// @name Control points
    ///@{

    /// The control points; none by default. The getters return the vector itself, to read
    /// or change in place; the setter replaces it by a copy.
    std::vector<ControlPoint>& GetControlPoints() { return m_controlPoints; }
    const std::vector<ControlPoint>& GetControlPoints() const { return m_controlPoints; }
    void SetControlPoints(const std::vector<ControlPoint>& points) { m_controlPoints = points; }
    ///@}

    /// @name Description
    ///@{

    /// Free text describing the set; empty by default.
    const std::string& GetDescription() const { return m_description; }
    void SetDescription(const std::string& description) { m_description = description; }
    ///@}

    /// @name History
    ///@{

    /// The history; empty by default, and not copied with the container. The getters return
    /// the vector itself, to read or change in place; the setter replaces it by a copy.
    std::vector<HistoryEvent>& GetHistory() { return m_history; }
    const std::vector<HistoryEvent>& GetHistory() const { return m_history; }
    void SetHistory(const std::vector<HistoryEvent>& history) { m_history = history; }
    ///@}

    /// @name Metadata
    ///@{

    /// The key/value metadata; empty by default. The getters return the map itself, to read
    /// or change in place; the setter replaces it by a copy.
    KVPMetadata& GetKVPMetadata() { return m_metadata; }
    const KVPMetadata& GetKVPMetadata() const { return m_metadata; }
    void SetKVPMetadata(const KVPMetadata& metadata) { m_metadata = metadata; }
    ///@}

private:
    void Copy(const ControlPointContainer& other);

    KVPMetadata m_metadata;
    std::vector<ControlPoint> m_controlPoints;
    std::unique_ptr<kora::ogc::cs::ICRS> m_crs;
    std::string m_description;
    std::vector<HistoryEvent> m_history;
};

}  // namespace kora::kubo

#endif  // VRKFRAMEWORK_BASIC_KUBO_CONTROLPOINTS_CONTROLPOINTCONTAINER_H

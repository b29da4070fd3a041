// Copying a control point set and holding its coordinate reference system.
#include "vrkframework/basic/kubo/controlpoints/controlpointcontainer.h"

#include <utility>  // std::move

#include "vrkframework/platform/exception.h"

namespace kora::kubo {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/kubo/controlpoints/controlpointcontainer";

}  // namespace

ControlPointContainer::ControlPointContainer() = default;

ControlPointContainer::ControlPointContainer(const ControlPointContainer& other) { Copy(other); }

ControlPointContainer& ControlPointContainer::operator=(const ControlPointContainer& other) {
    Copy(other);
    return *this;
}

ControlPointContainer::ControlPointContainer(ControlPointContainer&& other) noexcept = default;

// It checks the CRS as copy assignment does, so it may throw.
// NOLINTNEXTLINE(bugprone-exception-escape,performance-noexcept-move-constructor)
ControlPointContainer& ControlPointContainer::operator=(ControlPointContainer&& other) {
    Copy(other);
    return *this;
}

ControlPointContainer::~ControlPointContainer() = default;

void ControlPointContainer::SetCRS(const kora::ogc::cs::ICRS& crs) {
    // The held CRS goes whatever the outcome, but only after `crs` has been read and
    // cloned: `crs` may be the held one itself (SetCRS(*GetCRS()), self-assignment).
    const bool accepted = crs.GetDimension() != 2;
    std::unique_ptr<kora::ogc::cs::ICRS> clone(accepted ? crs.Clone() : nullptr);
    m_crs = std::move(clone);
    if (!accepted) {
        throw kora::ParameterException(
            "oCRS", kora::ParameterException::PARAMETER_INVALID_VALUE, "Dimension = 2",
            "Dimension = 3", "ControlPointContainer::SetCRS(): CRS must be 3-dimensional",
            kSourcePath,
            "void __cdecl kora::kubo::ControlPointContainer::SetCRS(const class "
            "kora::ogc::cs::ICRS &)",
            128);
    }
}

void ControlPointContainer::Copy(const ControlPointContainer& other) {
    // The CRS goes through SetCRS so that its dimension is checked again; a source
    // without one leaves the target's CRS as it is.
    if (other.m_crs) {
        SetCRS(*other.m_crs);
    }
    m_controlPoints = other.m_controlPoints;
    if (&m_description == &other.m_description) {
        return;
    }
    m_description = other.m_description;
    m_metadata.clear();
    m_metadata.insert(other.m_metadata.begin(), other.m_metadata.end());
}

}  // namespace kora::kubo

// Ground control points in a container with its reference system, metadata and history.
#include <vrkframework/basic/kubo/kubo.h>

using namespace kora::kubo;

class Projected : public kora::ogc::cs::ICRS {
public:
    unsigned int GetDimension() const override { return 3; }
    ICRS* Clone() const override { return new Projected(*this); }
};

int main() {
    ControlPoint point(1);
    point.SetName("Church tower");
    GroundLocation ground;
    ground.SetCoords(500120.0, 4649870.0, 412.0);
    point.SetGroundLocation(ground);
    ImageLocation pixel;
    pixel.SetCoords(1024.5, 733.0);  // column, row
    point.GetImageLocations().push_back(pixel);

    ControlPointContainer container;
    container.SetCRS(Projected());  // the container keeps its own clone
    container.GetControlPoints().push_back(point);
    container.GetKVPMetadata()["Sensor"] = "frame camera";
    container.GetHistory().emplace_back(1, "Point measured");

    const ControlPointContainer copy(container);  // a copy starts with an empty history
    const bool ok = copy.GetControlPoints().front() == point &&
                    copy.GetKVPMetadata().count("SENSOR") == 1 && copy.GetHistory().empty();
    return ok ? 0 : 1;
}

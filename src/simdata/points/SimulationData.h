#pragma once

#include <cstdint>

namespace SimulationDataPoints
{

class VtCSimulationDataFrame;

/// The value of an instrument stream as it travels to the instrument, 16 bytes.
struct VtTInstrumentVariant
{
    static constexpr std::int32_t typeDouble = 10;

    double value = 0.0;
    std::int32_t type = typeDouble;
    std::int32_t reserved = 0;
};
static_assert(sizeof(VtTInstrumentVariant) == 16);

/// The value of one channel in one frame: a pose or the value of an instrument stream.
///
/// A view into its frame, valid as long as that. A pose places its body in the scene: z up, metres, and a point is
/// multiplied from the right (p' = M p). An instrument stream has no pose: asked for one it gives the identity, and
/// zero angles and translation.
class VtCSimulationData
{
public:
    /// `m[row][column]`: rotation in the upper left, translation in `m[0..2][3]`.
    void GetMatrix4x4(float m[4][4]) const;
    void GetMatrix3x3(float m[3][3]) const;
    void GetVector(float v[3]) const;

    /// The rotation as R = Rz(a) Rx(b) Rz(c), the classical z-x'-z'' angles: precession, nutation, spin. `b` lies in
    /// 0 to 180 degrees. Where b is 0 or 180 only a + c or a - c is defined: then `c` is 0.
    /// `degrees` non-zero gives degrees, zero radians.
    void GetEulerAngles(double& a, double& b, double& c, int degrees) const;

    /// The rotation as R = Rx(a) Ry(b) Rz(c), the Kardan (Tait-Bryan) angles x-y'-z''. `b` lies in -90 to 90 degrees;
    /// at either end only a + c or a - c is defined: then `c` is 0.
    void GetKardanAngles(double& a, double& b, double& c, int degrees) const;

    bool isInstrumentStream() const { return instrument; }

    /// Non-zero if `value` was filled; 0 for a pose, and for a stream without a finite number in this frame.
    int getInstrumentValue(VtTInstrumentVariant& value) const;

private:
    friend class VtCSimulationDataFrame;

    VtCSimulationData(const VtCSimulationDataFrame& owner, std::uint32_t where, bool stream)
        : frame(&owner), offset(where), instrument(stream)
    {
    }

    const VtCSimulationDataFrame* frame;
    std::uint32_t offset; ///< of the value in the frame's record
    bool instrument;
};

} // namespace SimulationDataPoints

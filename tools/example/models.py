"""Writing a mesh as a model file: COLLADA 1.4 and VRML 97, both y-up, in metres."""

from __future__ import annotations

from dataclasses import dataclass, field
from pathlib import Path
from xml.sax.saxutils import escape

import numpy as np

from mesh import Array, Chunk, Mesh

Colour = tuple[float, float, float]


@dataclass(frozen=True)
class Material:
    """What a surface looks like; a textured one has its colour from the file, white below it."""

    diffuse: Colour = (1.0, 1.0, 1.0)
    texture: str = ""
    specular: float = 0.05
    shininess: float = 16.0
    emission: float = 0.0
    ambient: float = 0.55
    see_through: bool = False        # by the alpha of its texture

    def colours(self) -> tuple[Colour, Colour, Colour, Colour]:
        """Diffuse, ambient, specular, emission."""
        r, g, b = self.diffuse
        a, s, e = self.ambient, self.specular, self.emission
        return (r, g, b), (r * a, g * a, b * a), (s, s, s), (r * e, g * e, b * e)


@dataclass
class Model:
    """Named geometries with the materials they use. The order of geometries is kept."""

    name: str
    materials: dict[str, Material]
    geometries: dict[str, Mesh] = field(default_factory=dict)

    def geometry(self, name: str) -> Mesh:
        return self.geometries.setdefault(name, Mesh())

    def triangle_count(self) -> int:
        return sum(mesh.triangle_count() for mesh in self.geometries.values())


def to_model_axes(vectors: Array) -> Array:
    """Scene axes (z up) to model axes (y up): the inverse of what the scene does to every model."""
    return np.stack([vectors[:, 0], vectors[:, 2], -vectors[:, 1]], axis=-1)


def _numbers(values: Array, digits: int) -> str:
    rounded = np.round(np.asarray(values, float), digits) + 0.0
    return " ".join(f"{value:.{digits}f}".rstrip("0").rstrip(".") for value in rounded.reshape(-1))


def _source(ident: str, values: Array, axes: str, digits: int) -> str:
    params = "".join(f'<param name="{axis}" type="float"/>' for axis in axes)
    return (f'<source id="{ident}"><float_array id="{ident}-array" count="{values.size}">'
            f"{_numbers(values, digits)}</float_array><technique_common>"
            f'<accessor source="#{ident}-array" count="{len(values)}" stride="{len(axes)}">'
            f"{params}</accessor></technique_common></source>\n")


def _geometry(name: str, parts: dict[str, Chunk]) -> str:
    text = f'<geometry id="{name}" name="{name}"><mesh>\n'
    chunks = list(parts.values())
    text += _source(f"{name}-p", to_model_axes(np.concatenate([c.positions for c in chunks])), "XYZ", 4)
    text += _source(f"{name}-n", to_model_axes(np.concatenate([c.normals for c in chunks])), "XYZ", 3)
    text += _source(f"{name}-t", np.concatenate([c.uvs for c in chunks]), "ST", 4)
    text += (f'<vertices id="{name}-v"><input semantic="POSITION" source="#{name}-p"/>'
             f'<input semantic="NORMAL" source="#{name}-n"/></vertices>\n')
    start = 0
    for material, chunk in parts.items():
        indices = " ".join(map(str, (chunk.triangles + start).reshape(-1)))
        start += len(chunk.positions)
        text += (f'<triangles count="{len(chunk.triangles)}" material="{material}">'
                 f'<input semantic="VERTEX" source="#{name}-v" offset="0"/>'
                 f'<input semantic="TEXCOORD" source="#{name}-t" offset="0" set="0"/>'
                 f"<p>{indices}</p></triangles>\n")
    return text + "</mesh></geometry>\n"


def _effect(name: str, material: Material) -> str:
    def colour(tag: str, rgb: Colour) -> str:
        return f"<{tag}><color>{_numbers(np.array([*rgb, 1.0]), 4)}</color></{tag}>"

    diffuse, ambient, specular, emission = material.colours()
    params = ""
    coloured = colour("diffuse", diffuse)
    if material.texture:
        params = (f'<newparam sid="{name}-surface"><surface type="2D"><init_from>{name}-image</init_from>'
                  f"</surface></newparam>\n"
                  f'<newparam sid="{name}-sampler"><sampler2D><source>{name}-surface</source>'
                  f"<wrap_s>WRAP</wrap_s><wrap_t>WRAP</wrap_t><minfilter>LINEAR_MIPMAP_LINEAR</minfilter>"
                  f"<magfilter>LINEAR</magfilter></sampler2D></newparam>\n")
        coloured = f'<diffuse><texture texture="{name}-sampler" texcoord="UV0"/></diffuse>'
    body = colour("emission", emission) + colour("ambient", ambient) + coloured
    body += colour("specular", specular)
    body += f"<shininess><float>{material.shininess:g}</float></shininess>"
    if material.see_through:
        body += (f'<transparent opaque="A_ONE"><texture texture="{name}-sampler" texcoord="UV0"/></transparent>'
                 "<transparency><float>1</float></transparency>")
    return (f'<effect id="{name}-effect"><profile_COMMON>\n{params}'
            f'<technique sid="common"><phong>{body}</phong></technique>\n</profile_COMMON></effect>\n')


def write_collada(model: Model, path: Path) -> None:
    """Writes the model with one node and one geometry of the same name for each named mesh."""
    merged = {name: mesh.merged() for name, mesh in model.geometries.items() if mesh.chunks}
    used = [name for name in model.materials if any(name in parts for parts in merged.values())]
    missing = {name for parts in merged.values() for name in parts} - set(used)
    if missing:
        raise ValueError(f"{model.name}: no material named {', '.join(sorted(missing))}")
    text = ('<?xml version="1.0" encoding="utf-8"?>\n'
            '<COLLADA xmlns="http://www.collada.org/2005/11/COLLADASchema" version="1.4.1">\n'
            "<asset><created>2024-01-01T00:00:00Z</created><modified>2024-01-01T00:00:00Z</modified>"
            '<unit name="meter" meter="1"/><up_axis>Y_UP</up_axis></asset>\n')
    images = [(name, model.materials[name].texture) for name in used if model.materials[name].texture]
    if images:
        text += "<library_images>\n"
        for name, texture in images:
            text += f'<image id="{name}-image"><init_from>{escape(texture)}</init_from></image>\n'
        text += "</library_images>\n"
    text += "<library_effects>\n" + "".join(_effect(n, model.materials[n]) for n in used)
    text += "</library_effects>\n<library_materials>\n"
    for name in used:
        text += (f'<material id="{name}" name="{name}"><instance_effect url="#{name}-effect"/></material>\n')
    text += "</library_materials>\n<library_geometries>\n"
    text += "".join(_geometry(name, parts) for name, parts in merged.items())
    text += ('</library_geometries>\n<library_visual_scenes><visual_scene id="Scene" name="Scene">\n')
    for name, parts in merged.items():
        bound = "".join(
            f'<instance_material symbol="{m}" target="#{m}"><bind_vertex_input semantic="UV0" '
            f'input_semantic="TEXCOORD" input_set="0"/></instance_material>' for m in parts)
        text += (f'<node id="{name}-node" name="{name}"><instance_geometry url="#{name}"><bind_material>'
                 f"<technique_common>{bound}</technique_common></bind_material></instance_geometry></node>\n")
    text += ('</visual_scene></library_visual_scenes>\n'
             '<scene><instance_visual_scene url="#Scene"/></scene>\n</COLLADA>\n')
    path.parent.mkdir(parents=True, exist_ok=True)
    path.write_text(text, encoding="utf-8")


def write_vrml(model: Model, path: Path) -> None:
    """Writes the model as VRML 97: a shape for each material of each named mesh."""
    text = "#VRML V2.0 utf8\n"
    for name, mesh in model.geometries.items():
        for material, chunk in mesh.merged().items():
            look = model.materials[material]
            diffuse, _, specular, emission = look.colours()
            texture = ""
            if look.texture:
                texture = f'\n      texture ImageTexture {{ url "{look.texture}" }}'

            def rows(values: Array, digits: int) -> str:
                return ",\n          ".join(_numbers(row, digits) for row in values)

            index = ", ".join(f"{a}, {b}, {c}, -1" for a, b, c in chunk.triangles)
            text += f"""DEF {name}_{material} Shape {{
  appearance Appearance {{
      material Material {{
        diffuseColor {_numbers(np.array(diffuse), 4)}
        ambientIntensity {look.ambient:g}
        specularColor {_numbers(np.array(specular), 4)}
        emissiveColor {_numbers(np.array(emission), 4)}
        shininess {look.shininess / 128.0:g}
      }}{texture}
  }}
  geometry IndexedFaceSet {{
      solid TRUE
      coord Coordinate {{ point [
          {rows(to_model_axes(chunk.positions), 4)} ] }}
      normal Normal {{ vector [
          {rows(to_model_axes(chunk.normals), 3)} ] }}
      texCoord TextureCoordinate {{ point [
          {rows(chunk.uvs, 4)} ] }}
      normalPerVertex TRUE
      coordIndex [ {index} ]
  }}
}}
"""
    path.parent.mkdir(parents=True, exist_ok=True)
    path.write_text(text, encoding="utf-8")

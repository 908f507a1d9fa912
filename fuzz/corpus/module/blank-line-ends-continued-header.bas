Sub y _z
3
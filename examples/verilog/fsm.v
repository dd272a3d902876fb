// A traffic light: green, yellow, red and red-yellow in turn, each held for a count of cycles, with
// a pedestrian request that cuts green short; one-hot outputs, synchronous reset.
module fsm (input clk, input rst, input req, output green, output yellow, output red);
    localparam GREEN = 2'd0, YELLOW = 2'd1, RED = 2'd2, RED_YELLOW = 2'd3;
    reg [1:0] state;
    reg [3:0] count;
    wire done = count == 4'd0;
    always @(posedge clk)
        if (rst) begin
            state <= GREEN;
            count <= 4'd9;
        end else if (done || (state == GREEN && req)) begin
            case (state)
                GREEN:      begin state <= YELLOW;     count <= 4'd2; end
                YELLOW:     begin state <= RED;        count <= 4'd7; end
                RED:        begin state <= RED_YELLOW; count <= 4'd1; end
                RED_YELLOW: begin state <= GREEN;      count <= 4'd9; end
            endcase
        end else
            count <= count - 4'd1;
    assign green = state == GREEN;
    assign yellow = state == YELLOW || state == RED_YELLOW;
    assign red = state == RED || state == RED_YELLOW;
endmodule
